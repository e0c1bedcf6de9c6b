// SPDX-License-Identifier: Apache-2.0
//
// Texts and bytes in the form of a TOML document. What is not printable is escaped, so that a
// document can be shown on a terminal.
#pragma once

#include <string>
#include <string_view>

namespace orvane::kit {

/// Whether `text` is readable in a document: UTF-8, and at most one character in eight bytes is not
/// printable, apart from line ends and tabs.
bool isReadable(std::string_view text);

/// The UTF-8 text `text` in quotes, on one line.
std::string tomlText(std::string_view text);

/// The same for one line; more lines stay lines, in three quotes.
std::string tomlLines(std::string_view text);

/// `bytes` in hex, in quotes; more than 32 bytes take several lines.
std::string tomlHex(std::string_view bytes);

/// `bytes` as text if it is readable and does not begin with "hex:", else as "hex:" and hex.
std::string tomlTextOrHex(std::string_view bytes);

/// The same for a path or a name in it, which is a text whenever it is UTF-8.
std::string tomlPath(std::string_view path);

} // namespace orvane::kit
