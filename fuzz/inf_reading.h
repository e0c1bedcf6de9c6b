// SPDX-License-Identifier: Apache-2.0
//
// A second, very simple reading of version description files that shares nothing with the product,
// to compare the product's with.
#pragma once

#include <string>
#include <utility>
#include <vector>

namespace orvane::fuzz {

/// Key and value of each line that makes an entry, the last line for each key, in byte order of the
/// keys.
using PlainRecord = std::vector<std::pair<std::string, std::string>>;

/// The text without the spaces at either end.
std::string plainTrim(const std::string& text);

/// The entries of a file with the content `text`.
PlainRecord plainRead(const std::string& text);

/// The value of `key`, or an empty text.
std::string plainValue(const PlainRecord& record, const std::string& key);

/// The application's version among `records`, which are in the order of the folder's listing.
std::string plainSelect(const std::vector<PlainRecord>& records);

/// Six hexadecimal digits, or more where a component is negative.
std::string plainFormat(const std::string& version);

/// Two hexadecimal digits, or eight for a negative number.
std::string plainFormatByte(const std::string& component);

} // namespace orvane::fuzz
