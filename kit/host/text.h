// SPDX-License-Identifier: Apache-2.0
//
// Bytes and numbers as text for people.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>

namespace orvane::kit {

/// Whether `text` is well-formed UTF-8: shortest forms only, no surrogates, nothing above U+10FFFF.
bool isUtf8(std::string_view text);

/// `bytes` as one line of text: anything that is not printable UTF-8 is escaped, as in \n, \\ or
/// \x1b.
std::string printable(std::string_view bytes);

/// `bytes` in hex, two digits each, with blanks between them.
std::string hexText(std::string_view bytes);

/// `text` in quotes.
std::string inQuotes(std::string_view text);

/// "1 line", "2 lines".
std::string counted(std::uint64_t count, const std::string& thing);

} // namespace orvane::kit
