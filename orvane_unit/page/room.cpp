// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/page/room.h"

#include "kit/host/text.h"

namespace orvane::desk {

namespace {

std::string moreBytes(std::size_t count) {
    return "(" + kit::counted(count, "more byte") + ")";
}

void addSign(Markup& page, std::size_t count) {
    if (count > 0) {
        page.add("small", {{"class", "sign"}}, moreBytes(count));
    }
}

/// At most `length`, without the begin of a character of UTF-8 whose rest is behind it.
std::size_t wholeCharacters(std::string_view text, std::size_t length) {
    constexpr std::size_t LONGEST_CHARACTER = 4;
    const auto continues = [text](std::size_t at) {
        return at < text.size() && (static_cast<unsigned char>(text[at]) & 0xC0U) == 0x80U;
    };
    for (std::size_t back = 0; back < LONGEST_CHARACTER && back <= length; ++back) {
        if (!continues(length - back)) {
            return length - back;
        }
    }
    return length; // no character is so long
}

} // namespace

std::string_view Room::take(std::string_view text) {
    const std::string_view begin = isUsedUp() ? "" : text.substr(0, wholeCharacters(text, bytes_));
    texts_ -= texts_ == 0 ? 0 : 1;
    bytes_ -= begin.size();
    return begin;
}

void addText(Markup& page, std::string_view text, Room& room) {
    const std::string_view shown = room.take(text);
    page.addText(shown);
    addSign(page, text.size() - shown.size());
}

void addCode(Markup& page, std::string_view text, Room& room) {
    const std::string_view shown = room.take(text);
    page.add("code", shown);
    addSign(page, text.size() - shown.size());
}

std::string briefly(const std::string& text) {
    return text.size() <= LONGEST_IN_SENTENCE ? text
                                              : text.substr(0, LONGEST_IN_SENTENCE) + " ... " +
                                                    moreBytes(text.size() - LONGEST_IN_SENTENCE);
}

} // namespace orvane::desk
