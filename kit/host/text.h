// SPDX-License-Identifier: Apache-2.0
//
// Bytes and numbers as text for people.
#pragma once

#include <cstdint>
#include <functional>
#include <string>
#include <string_view>

namespace orvane::kit {

/// Whether `text` is well-formed UTF-8: shortest forms only, no surrogates, nothing above U+10FFFF.
bool isUtf8(std::string_view text);

/// Whether a terminal shows `character` as itself. It obeys control characters, does not show
/// others at all, and reverses what follows some.
bool isPrintable(char32_t character);

/// Calls `take` for each character of `text`, which is UTF-8, with the bytes of the character.
void forEachCharacter(std::string_view text,
                      const std::function<void(char32_t, std::string_view)>& take);

/// `bytes` as one line of text: anything that is not printable UTF-8 is escaped, as in \n, \\ or
/// \x1b. Whatever comes from a unit, a file or the command line is printed in this form.
std::string printable(std::string_view bytes);

/// The same for each line of `bytes`. Line ends and tabs stay.
std::string printableLines(std::string_view bytes);

/// The last `count` digits of `number` in hex.
std::string hexDigits(std::uint32_t number, unsigned count);

/// A code unit as \u and four digits, the escape of JSON and TOML.
std::string unicodeEscape(char32_t unit);

/// `bytes` in hex, two digits each, with blanks between them.
std::string hexText(std::string_view bytes);

/// `text` in quotes.
std::string inQuotes(std::string_view text);

/// "1 line", "2 lines".
std::string counted(std::uint64_t count, const std::string& thing);

} // namespace orvane::kit
