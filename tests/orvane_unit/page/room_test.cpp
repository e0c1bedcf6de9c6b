// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/page/markup.h"
#include "orvane_unit/page/room.h"

#include <gtest/gtest.h>

#include <cstddef>
#include <string>

namespace orvane::test {

namespace {

using desk::Markup;
using desk::Room;

TEST(RoomTest, HoldsSoManyTexts) {
    Room room;
    for (std::size_t i = 1; i < Room::MOST_TEXTS; ++i) {
        EXPECT_EQ(room.take("a"), "a");
    }
    EXPECT_FALSE(room.isUsedUp());
    EXPECT_EQ(room.take(""), "");
    EXPECT_TRUE(room.isUsedUp());
    EXPECT_EQ(room.take("a"), "");
}

TEST(RoomTest, HoldsSoManyBytes) {
    const std::string most(Room::MOST_BYTES, 'x');
    Room room;
    EXPECT_EQ(room.take(most.substr(1)), most.substr(1));
    EXPECT_FALSE(room.isUsedUp());
    EXPECT_EQ(room.take("ab"), "a");
    EXPECT_TRUE(room.isUsedUp());
    EXPECT_EQ(Room().take(most), most);
    EXPECT_EQ(Room().take(most + "x"), most);
}

TEST(RoomTest, NoCharacterIsCutInTwo) {
    const std::string before(Room::MOST_BYTES - 1, 'x');
    EXPECT_EQ(Room().take(before + "\u00e9y"), before);
    EXPECT_EQ(Room().take(before.substr(1) + "\u00e9y"), before.substr(1) + "\u00e9");
    const std::string noText(Room::MOST_BYTES + 1, '\xa9'); // which no character begins
    EXPECT_EQ(Room().take(noText).size(), Room::MOST_BYTES);
}

TEST(RoomTest, WhatHasNoRoomIsCounted) {
    Markup page;
    Room room;
    const std::size_t begin = page.document().size();
    const std::string most(Room::MOST_BYTES - 2, 'x');
    addCode(page, most, room);
    addText(page, "abc", room);
    addCode(page, "de", room);
    EXPECT_EQ(page.document().substr(begin),
              "\n<code>" + most + "</code>ab\n<small class=\"sign\">(1 more byte)</small>" +
                  "\n<code></code>\n<small class=\"sign\">(2 more bytes)</small>");
}

TEST(RoomTest, LongTextIsCutInASentence) {
    const std::string longest(desk::LONGEST_IN_SENTENCE, 'x');
    EXPECT_EQ(desk::briefly(longest), longest);
    EXPECT_EQ(desk::briefly(longest + "yz"), longest + " ... (2 more bytes)");
}

} // namespace

} // namespace orvane::test
