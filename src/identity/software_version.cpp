// SPDX-License-Identifier: Apache-2.0
#include "identity/software_version.h"

#include <algorithm>
#include <cstdlib>
#include <limits>
#include <utility>

namespace orvane {

namespace {

constexpr char INF_MARKER[] = ".inf";
constexpr char AFFIX_SEPARATOR = '_';

/// The records of the last scan, in listing order. They live as long as the process; each scan
/// empties them first.
std::vector<Inf_Data> InfRecords; // NOLINT(*-non-const-global-variables)

void scanVersionFiles() {
    InfRecords.clear();
    VersionFileListing files;
    std::string path;
    while (files.next(path)) {
        Inf_Data record;
        readInfFile(path, record);
        InfRecords.push_back(std::move(record));
    }
}

/// The text before the first `separator`, or all of it when there is none.
std::string before(const std::string& text, char separator) {
    return text.substr(0, text.find(separator));
}

/// The text after the first `separator`, or all of it when there is none.
std::string after(const std::string& text, char separator) {
    const std::size_t at = text.find(separator);
    return at == std::string::npos ? text : text.substr(at + 1);
}

} // namespace

bool isVersionFile(const std::string& path) {
    // Anywhere in the name, on purpose, not only at its end: a.info and b.inf.old match, too.
    return path.find(INF_MARKER) != std::string::npos;
}

VersionFileListing::VersionFileListing() : folder_(opendir(VERSION_DIR)) {}

VersionFileListing::~VersionFileListing() {
    if (isOpen()) {
        closedir(folder_);
    }
}

bool VersionFileListing::next(std::string& path) {
    if (!isOpen()) {
        return false;
    }
    while (const dirent* entry = readdir(folder_)) {
        path = std::string(VERSION_DIR) + entry->d_name;
        if (isVersionFile(path)) {
            return true;
        }
    }
    return false;
}

bool isApplication(const Inf_Data& record) {
    // A substring test, on purpose: a type of MainApplication matches, too.
    return infValue(record, TYPE_KEY).find(APPLICATION_TYPE) != std::string::npos;
}

std::size_t chooseApplication(const std::vector<Inf_Data>& records) {
    const auto application = std::find_if(records.begin(), records.end(), isApplication);
    return static_cast<std::size_t>(application - records.begin());
}

std::string versionText(const Inf_Data& record) {
    return after(infValue(record, VERSION_KEY), AFFIX_SEPARATOR);
}

bool isNoVersion(const std::string& text) {
    return text.empty() || text == NO_VERSION;
}

std::string softwareVersion() {
    try {
        return formatVersion(findApplicationVersion());
    } catch (...) {
        return DEFAULT_SOFTWARE_VERSION;
    }
}

std::string findApplicationVersion() {
    try {
        scanVersionFiles();
        const std::size_t application = chooseApplication(InfRecords);
        return application == InfRecords.size() ? std::string()
                                                : versionText(InfRecords[application]);
    } catch (...) {
        return {}; // files too large for memory count as unreadable
    }
}

std::string formatVersion(const std::string& text) {
    if (isNoVersion(text)) {
        return DEFAULT_SOFTWARE_VERSION;
    }
    const VersionComponents components = versionComponents(text);
    return formatVersionByte(components[0]) + formatVersionByte(components[1]) +
           formatVersionByte(components[2]);
}

VersionComponents versionComponents(const std::string& text) {
    // `after` returns the whole text when no separator is left, so a missing component repeats the
    // one before it, on purpose.
    const std::string fromSecond = after(text, COMPONENT_SEPARATOR);
    const std::string fromThird = after(fromSecond, COMPONENT_SEPARATOR);
    VersionComponents components;
    components[0] = before(text, COMPONENT_SEPARATOR);
    components[1] = before(fromSecond, COMPONENT_SEPARATOR);
    components[2] = before(fromThird, AFFIX_SEPARATOR);
    return components;
}

std::int32_t componentNumber(const std::string& component) {
    using Limits = std::numeric_limits<std::int32_t>;
    // strtol reads what a formatted extraction reads, and gives the nearest long when out of range.
    const long nearest = std::strtol(component.c_str(), nullptr, 10);
    return static_cast<std::int32_t>(
        std::min<long>(std::max<long>(nearest, Limits::min()), Limits::max()));
}

std::string formatVersionByte(const std::string& component) {
    constexpr char HEX_DIGITS[] = "0123456789abcdef";
    // The remainder keeps the dividend's sign.
    auto value = static_cast<std::uint32_t>(componentNumber(component) % 256);
    std::string hex;
    do {
        hex.insert(hex.begin(), HEX_DIGITS[value % 16]);
        value /= 16;
    } while (value != 0);
    return hex.size() < 2 ? "0" + hex : hex;
}

} // namespace orvane
