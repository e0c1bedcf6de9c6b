// SPDX-License-Identifier: Apache-2.0
//
// The version of the unit's application software, from the version description files.
#pragma once

#include "identity/inf_file.h"

#include <dirent.h>

#include <array>
#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

namespace orvane {

/// Folder of the version description files, with its trailing slash.
constexpr char VERSION_DIR[] = "/fs/rwdata/.Version/";

/// The keys of a version description file that matter here.
constexpr char TYPE_KEY[] = "Type";
constexpr char VERSION_KEY[] = "Version Number";

/// The "Type" of the application contains this.
constexpr char APPLICATION_TYPE[] = "Application";

/// Stands for a missing version.
constexpr char NO_VERSION[] = "N/A";

/// Between the components of a version.
constexpr char COMPONENT_SEPARATOR = '.';

/// What softwareVersion gives when there is no usable version.
constexpr char DEFAULT_SOFTWARE_VERSION[] = "000000";

/// Whether the file at `path` is a version description file: ".inf" may be anywhere in it.
bool isVersionFile(const std::string& path);

/// The version description files of VERSION_DIR, one by one, in the order of the directory listing.
class VersionFileListing {
public:
    VersionFileListing();
    ~VersionFileListing();
    VersionFileListing(const VersionFileListing&) = delete;
    VersionFileListing& operator=(const VersionFileListing&) = delete;

    /// Whether the folder could be opened.
    bool isOpen() const { return folder_ != nullptr; }

    /// Sets `path` to the next file. False at the end, and at once without a folder; `path` is then
    /// unspecified.
    bool next(std::string& path);

private:
    DIR* folder_;
};

/// Whether `record` describes the application: its "Type" contains "Application".
bool isApplication(const Inf_Data& record);

/// The index in `records` of the first application; records.size() when there is none.
std::size_t chooseApplication(const std::vector<Inf_Data>& records);

/// The "Version Number" of `record` after its first "_", or all of it when it has no "_"; the empty
/// string when there is no such key.
std::string versionText(const Inf_Data& record);

/// Whether a version text is that of no version: empty, or "N/A".
bool isNoVersion(const std::string& text);

/// formatVersion of findApplicationVersion; DEFAULT_SOFTWARE_VERSION when memory runs out; where
/// even that short string needs memory (GCC before 5), it may throw std::bad_alloc.
std::string softwareVersion();

/// Scans VERSION_DIR and returns the versionText of the application: the first in the order of the
/// directory listing. The empty string when there is no such file, value or folder, or when memory
/// runs out.
std::string findApplicationVersion();

/// The versionComponents of a version text, at least two hexadecimal digits each; "000000" for no
/// version. "1.2" gives "010202".
std::string formatVersion(const std::string& text);

/// The first three components of a version text. A missing one repeats the one before it.
using VersionComponents = std::array<std::string, 3>;
VersionComponents versionComponents(const std::string& text);

/// The decimal number at the start of `component`; 0 if there is none. A number outside the range
/// of a 32-bit integer counts as the nearest one in it.
std::int32_t componentNumber(const std::string& component);

/// The number of `component` modulo 256 in lower-case hexadecimal of at least two digits. The
/// remainder keeps the sign: "-1" gives "ffffffff".
std::string formatVersionByte(const std::string& component);

} // namespace orvane
