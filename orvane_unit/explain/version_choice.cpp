// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/explain/version_choice.h"

#include "identity/software_version.h"
#include "kit/description/value_key.h"
#include "kit/host/input_kind.h"
#include "kit/host/whole_file.h"
#include "orvane_unit/explain/place.h"
#include "orvane_unit/explain/reasons.h"

#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <fstream>

namespace orvane::desk {

namespace {

/// A file of short lines takes many times its size in memory. In bytes.
constexpr std::uint64_t LONGEST_VERSION_FILE = std::uint64_t{16} << 20U;

/// The number, from 1, of the last line that gives `key` the value that it has in `record`; 0 when
/// none does.
std::size_t lineOf(const std::string& path, const std::string& key, const Inf_Data& record) {
    std::ifstream file(path);
    std::size_t found = 0;
    std::string line;
    for (std::size_t number = 1; std::getline(file, line); ++number) {
        Inf_Data alone;
        addInfLine(line, alone);
        if (alone.count(key) != 0 && infValue(alone, key) == infValue(record, key)) {
            found = number;
        }
    }
    return found;
}

bool isNumeric(const std::string& component) {
    char* end = nullptr;
    static_cast<void>(std::strtol(component.c_str(), &end, 10));
    return end != component.c_str();
}

/// Whether the digits that are written for a component have its number.
bool keepsItsNumber(const std::string& component) {
    return std::stoll(formatVersionByte(component), nullptr, 16) == componentNumber(component);
}

/// Whether a component appended to `version` would count.
bool isIncomplete(const std::string& version) {
    return formatVersion(version + COMPONENT_SEPARATOR + "1") !=
           formatVersion(version + COMPONENT_SEPARATOR + "2");
}

} // namespace

VersionFiles readVersionFiles() {
    kit::lookAtSequentialInput(VERSION_DIR);
    VersionFiles versions;
    VersionFileListing listing;
    versions.hasFolder = listing.isOpen();
    std::vector<Inf_Data> records;
    for (std::string path; listing.next(path);) {
        kit::lookAtSequentialInput(path);
        kit::requireShort(path, LONGEST_VERSION_FILE);
        records.emplace_back();
        readInfFile(path, records.back());
        versions.files.push_back({path, records.back(), isApplication(records.back())});
    }
    const std::size_t chosen = chooseApplication(records);
    if (chosen != records.size()) {
        versions.chosen = chosen;
    }
    return versions;
}

Origin versionTextOrigin(const VersionFiles& versions) {
    if (!versions.hasFolder) {
        return {{Reason::versionFolderMissing},
                kit::fileKey(VERSION_DIR),
                VersionFolderPlace{VERSION_DIR, {}}};
    }
    if (!versions.chosen) {
        return {{Reason::versionNoApplication},
                kit::fileKey(VERSION_DIR),
                VersionFolderPlace{VERSION_DIR, versions.files.size()}};
    }
    const VersionFile& file = versions.files[*versions.chosen];
    Origin origin{{Reason::fromVersionFile},
                  kit::fileKey(file.path),
                  VersionPlace{file.path, lineOf(file.path, VERSION_KEY, file.record), VERSION_KEY,
                               infValue(file.record, VERSION_KEY)}};
    const std::string text = versionText(file.record);
    if (text.empty()) {
        origin.reasons = {Reason::versionNumberMissing};
    } else if (text == NO_VERSION) {
        origin.reasons = {Reason::versionNotAvailable};
    }
    return origin;
}

Origin versionDigitsOrigin(const VersionFiles& versions) {
    Origin origin = versionTextOrigin(versions);
    if (origin.reasons.front() != Reason::fromVersionFile) {
        return origin;
    }
    const std::string version = versionText(versions.files[*versions.chosen].record);
    const VersionComponents components = versionComponents(version);
    std::vector<Reason> faults;
    if (isIncomplete(version)) {
        faults.push_back(Reason::versionIncomplete);
    }
    if (!std::all_of(components.begin(), components.end(), isNumeric)) {
        faults.push_back(Reason::versionNotNumeric);
    }
    if (!std::all_of(components.begin(), components.end(), keepsItsNumber)) {
        faults.push_back(Reason::versionOutOfRange);
    }
    if (!faults.empty()) {
        origin.reasons = faults;
    }
    return origin;
}

} // namespace orvane::desk
