// SPDX-License-Identifier: Apache-2.0
//
// The version of the unit's application software, out of the version description files.
#pragma once

#include "identity/inf_file.h"

#include <string>

namespace orvane {

/// Folder of the version description files, with its trailing slash.
constexpr char VERSION_DIR[] = "/fs/rwdata/.Version/";

/// The keys of a version description file that count here.
constexpr char TYPE_KEY[] = "Type";
constexpr char VERSION_KEY[] = "Version Number";

/// What softwareVersion gives when there is no usable version.
constexpr char DEFAULT_SOFTWARE_VERSION[] = "000000";

/// Whether the file at `path` is a version description file: ".inf" may stand anywhere in it.
bool isVersionFile(const std::string& path);

/// Whether `record` describes the application: its "Type" contains "Application".
bool isApplication(const Inf_Data& record);

/// The "Version Number" of `record` behind its first "_", or all of it when it has none; the empty
/// string when there is none.
std::string versionText(const Inf_Data& record);

/// formatVersion of findApplicationVersion; DEFAULT_SOFTWARE_VERSION when memory runs out. Where
/// even a short string needs memory (GCC before 5), std::bad_alloc may leave it then.
std::string softwareVersion();

/// Scans VERSION_DIR afresh and returns the versionText of the application: the first in the order
/// of the directory listing. The empty string when there is no such file, value or folder, or when
/// memory runs out.
std::string findApplicationVersion();

/// The first three components of a version text, two hexadecimal digits each; "000000" for an empty
/// text and for "N/A". A missing component repeats the one before it: "1.2" gives "010202".
std::string formatVersion(const std::string& text);

/// The decimal number at the start of `component`, 0 if there is none, modulo 256 in lower-case
/// hexadecimal of at least two digits. The remainder keeps the sign: "-1" gives "ffffffff". A
/// number past the range of a 32-bit integer counts as the nearest one in it.
std::string formatVersionByte(const std::string& component);

} // namespace orvane
