// SPDX-License-Identifier: Apache-2.0
//
// A second reading of version description files, as plain as can be and without anything of the
// product, for the product's own to be compared with.
#pragma once

#include <string>
#include <utility>
#include <vector>

namespace orvane::fuzz {

/// Key and value of each line that makes an entry; of lines with the same key, the last. In the
/// byte order of the keys.
using PlainRecord = std::vector<std::pair<std::string, std::string>>;

/// Without the spaces at either end.
std::string plainTrim(const std::string& text);

/// The entries of a file with the content `text`.
PlainRecord plainRead(const std::string& text);

/// The value of `key`, or nothing.
std::string plainValue(const PlainRecord& record, const std::string& key);

/// The application's version among `records`, which stand in the order of the folder's listing.
std::string plainSelect(const std::vector<PlainRecord>& records);

/// Six hexadecimal digits, or more where a component is negative.
std::string plainFormat(const std::string& version);

/// Two hexadecimal digits, or eight for a negative number.
std::string plainFormatByte(const std::string& component);

} // namespace orvane::fuzz
