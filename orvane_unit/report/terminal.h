// SPDX-License-Identifier: Apache-2.0
//
// Colours and bytes for people's eyes.
#pragma once

#include <cstdint>
#include <string>

namespace orvane::desk {

enum class Colour { plain, good, bad, added, removed, place, faint };

/// Whether standard output is a terminal and NO_COLOR is unset or empty.
bool hasColours();

/// `text` in the colour, or as it is where there are no colours.
std::string painted(Colour colour, const std::string& text);

/// `bytes` as one line of text: what is no printable UTF-8 is escaped as in \n, \\ or \x1b.
std::string printable(const std::string& bytes);

/// "1 line", "2 lines".
std::string counted(std::uint64_t count, const std::string& thing);

} // namespace orvane::desk
