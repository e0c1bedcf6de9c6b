// SPDX-License-Identifier: Apache-2.0
//
// Colours on a terminal.
#pragma once

#include <string>

namespace orvane::desk {

/// The colours by what they mean. The value is the number of the colour in an escape sequence
/// (ECMA-48, "SGR").
enum class Colour { good = 32, added = good, bad = 31, removed = bad, place = 36, faint = 2 };

/// Whether standard output is a terminal and NO_COLOR is unset or empty.
bool hasColours();

/// `text` in the colour, or as it is if there are no colours.
std::string painted(Colour colour, const std::string& text);

} // namespace orvane::desk
