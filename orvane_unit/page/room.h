// SPDX-License-Identifier: Apache-2.0
//
// How much of a unit's texts a page shows. A unit may have millions of lines, and a browser shows a
// page of many megabytes only slowly, if at all: what is not shown is counted in words.
#pragma once

#include "orvane_unit/page/markup.h"

#include <cstddef>
#include <string>
#include <string_view>

namespace orvane::desk {

/// The room that a part of a page has for texts of a unit.
class Room {
public:
    static constexpr std::size_t MOST_TEXTS = 1000;
    static constexpr std::size_t MOST_BYTES = std::size_t{32} << 10U;

    bool isUsedUp() const { return texts_ == 0 || bytes_ == 0; }

    /// Takes the room of `text`, and returns as much of it as there is room for.
    std::string_view take(std::string_view text);

private:
    std::size_t texts_ = MOST_TEXTS;
    std::size_t bytes_ = MOST_BYTES;
};

/// Adds `text`, as much of it as there is room for, and how many bytes more it has.
void addText(Markup& page, std::string_view text, Room& room);

/// The same, with the text as code.
void addCode(Markup& page, std::string_view text, Room& room);

/// The longest text of a unit in a sentence, in bytes.
constexpr std::size_t LONGEST_IN_SENTENCE = 4096;

/// `text`; of a longer one its begin, and how many bytes more it has.
std::string briefly(const std::string& text);

} // namespace orvane::desk
