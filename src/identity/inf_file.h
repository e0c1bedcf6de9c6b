// SPDX-License-Identifier: Apache-2.0
//
// Version description files: lines of "key = value", one file for each installed package.
#pragma once

#include <map>
#include <string>

namespace orvane {

/// One parsed file: values by key, in the byte-wise order of the keys. Neither has surrounding
/// blanks.
using Inf_Data = std::map<std::string, std::string>;

/// Splits one line, given without its line end. False, with both outputs unchanged, for a line
/// without "=" or with nothing after it. A carriage return at its end belongs to the value.
bool parseInfLine(const std::string& line, std::string& key, std::string& value);

/// Adds a line to `record`; it replaces an earlier one of the same key. A line that parseInfLine
/// refuses is skipped.
void addInfLine(const std::string& line, Inf_Data& record);

/// Adds the lines of the file at `path` to `record`, in order. A file that can't be opened or read
/// adds nothing.
void readInfFile(const std::string& path, Inf_Data& record);

/// The value of `key` in `record`, or the empty string.
std::string infValue(const Inf_Data& record, const std::string& key);

/// `text` without leading and trailing spaces (0x20 only: tabs and carriage returns stay).
std::string trimSpaces(const std::string& text);

} // namespace orvane
