// SPDX-License-Identifier: Apache-2.0
//
// Colours on a terminal.
#pragma once

#include <string>

namespace orvane::desk {

enum class Colour { plain, good, bad, added, removed, place, faint };

/// Whether standard output is a terminal and NO_COLOR is unset or empty.
bool hasColours();

/// `text` in the colour, or as it is where there are no colours.
std::string painted(Colour colour, const std::string& text);

} // namespace orvane::desk
