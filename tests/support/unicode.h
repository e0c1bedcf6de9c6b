// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <algorithm>
#include <iterator>

namespace orvane::test {

/// Whether `character` is of the Unicode categories Cc, Cf, Zl or Zp: a control or format
/// character, a separator of lines or paragraphs. The ranges are those of Python's `unicodedata`, a
/// category after the other, with what Unicode 15 has added.
inline bool isControlOrFormat(char32_t character) {
    struct Range {
        char32_t first;
        char32_t last;
    };
    constexpr Range RANGES[] = {
        // Cc
        {0x0, 0x1F},
        {0x7F, 0x9F},
        // Cf
        {0xAD, 0xAD},
        {0x600, 0x605},
        {0x61C, 0x61C},
        {0x6DD, 0x6DD},
        {0x70F, 0x70F},
        {0x890, 0x891},
        {0x8E2, 0x8E2},
        {0x180E, 0x180E},
        {0x200B, 0x200F},
        {0x202A, 0x202E},
        {0x2060, 0x2064},
        {0x2066, 0x206F},
        {0xFEFF, 0xFEFF},
        {0xFFF9, 0xFFFB},
        {0x110BD, 0x110BD},
        {0x110CD, 0x110CD},
        {0x13430, 0x13438},
        {0x13439, 0x1343F}, // Unicode 15
        {0x1BCA0, 0x1BCA3},
        {0x1D173, 0x1D17A},
        {0xE0001, 0xE0001},
        {0xE0020, 0xE007F},
        // Zl, Zp
        {0x2028, 0x2028},
        {0x2029, 0x2029},
    };
    return std::any_of(std::begin(RANGES), std::end(RANGES), [character](const Range& range) {
        return range.first <= character && character <= range.last;
    });
}

} // namespace orvane::test
