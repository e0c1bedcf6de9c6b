// SPDX-License-Identifier: Apache-2.0
//
// The version of the unit's application software, out of the version description files.
#pragma once

#include <string>

namespace orvane {

/// Folder of the version description files, with its trailing slash.
constexpr char VERSION_DIR[] = "/fs/rwdata/.Version/";

/// What softwareVersion gives when there is no usable version.
constexpr char DEFAULT_SOFTWARE_VERSION[] = "000000";

/// formatVersion of findApplicationVersion; DEFAULT_SOFTWARE_VERSION when memory runs out.
std::string softwareVersion();

/// Scans VERSION_DIR afresh and returns the "Version Number" of the first file, in the order of the
/// directory listing, whose "Type" contains "Application"; of that, what follows its first "_" if
/// it has one. The empty string when there is no such file, value or folder, or when memory runs
/// out.
std::string findApplicationVersion();

/// The first three components of a version text, two hexadecimal digits each; "000000" for an empty
/// text and for "N/A". A missing component repeats the one before it: "1.2" gives "010202".
std::string formatVersion(const std::string& text);

/// The decimal number at the start of `component`, 0 if there is none, modulo 256 in lower-case
/// hexadecimal of at least two digits. The remainder keeps the sign: "-1" gives "ffffffff". A
/// number past the range of a 32-bit integer counts as the nearest one in it.
std::string formatVersionByte(const std::string& component);

} // namespace orvane
