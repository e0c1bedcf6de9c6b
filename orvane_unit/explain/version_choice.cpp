// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/explain/version_choice.h"

#include "identity/software_version.h"
#include "orvane_unit/explain/reasons.h"

#include <dirent.h>

#include <algorithm>
#include <cstdlib>
#include <fstream>
#include <memory>
#include <utility>

namespace orvane::desk {

namespace {

struct CloseFolder {
    void operator()(DIR* folder) const { closedir(folder); }
};

/// The line that gives `key` its value: the last one, since later lines replace earlier ones.
std::size_t lineOf(const std::string& path, const std::string& wanted) {
    std::ifstream file(path);
    std::string line;
    std::string key;
    std::string value;
    std::size_t found = 0;
    for (std::size_t number = 1; std::getline(file, line); ++number) {
        if (parseInfLine(line, key, value) && key == wanted) {
            found = number;
        }
    }
    return found;
}

Origin originOf(const VersionFiles& versions) {
    if (!versions.hasFolder) {
        return {{Reason::versionFolderMissing}, std::string("file.") + VERSION_DIR, VERSION_DIR};
    }
    if (!versions.chosen) {
        return {{Reason::versionNoApplication},
                std::string("file.") + VERSION_DIR,
                std::to_string(versions.files.size()) + " version description files in " +
                    VERSION_DIR};
    }
    const VersionFile& file = versions.files[*versions.chosen];
    const std::size_t line = lineOf(file.path, VERSION_KEY);
    Origin origin{{Reason::fromVersionFile}, "file." + file.path, file.path};
    if (line != 0) {
        origin.detail += ":" + std::to_string(line) + ": " + VERSION_KEY + " is \"" +
                         infValue(file.record, VERSION_KEY) + "\"";
    }
    const std::string text = versionText(file.record);
    if (text.empty()) {
        origin.reasons = {Reason::versionNumberMissing};
    } else if (text == "N/A") {
        origin.reasons = {Reason::versionNotAvailable};
    }
    return origin;
}

/// The three texts of which the digits are made; fewer when the version has fewer.
std::vector<std::string> components(const std::string& version) {
    std::vector<std::string> parts;
    std::string rest = version;
    while (parts.size() < 3) {
        const std::size_t end = rest.find(parts.size() < 2 ? '.' : '_');
        parts.push_back(rest.substr(0, end));
        if (end == std::string::npos) {
            break;
        }
        rest.erase(0, end + 1);
    }
    return parts;
}

} // namespace

VersionFiles readVersionFiles() {
    VersionFiles versions;
    const std::unique_ptr<DIR, CloseFolder> folder(opendir(VERSION_DIR));
    if (folder == nullptr) {
        return versions;
    }
    versions.hasFolder = true;
    while (const dirent* entry = readdir(folder.get())) {
        VersionFile file{std::string(VERSION_DIR) + entry->d_name, {}, false};
        if (isVersionFile(file.path)) {
            readInfFile(file.path, file.record);
            file.isApplication = isApplication(file.record);
            if (file.isApplication && !versions.chosen) {
                versions.chosen = versions.files.size();
            }
            versions.files.push_back(std::move(file));
        }
    }
    return versions;
}

Origin versionTextOrigin(const VersionFiles& versions) {
    return originOf(versions);
}

Origin versionDigitsOrigin(const VersionFiles& versions) {
    Origin origin = originOf(versions);
    if (origin.reasons.front() != Reason::fromVersionFile) {
        return origin;
    }
    const std::vector<std::string> parts =
        components(versionText(versions.files[*versions.chosen].record));
    const auto is = [&parts](const auto& test) {
        return std::any_of(parts.begin(), parts.end(), test);
    };
    std::vector<Reason> reasons;
    if (parts.size() < 3) {
        reasons.push_back(Reason::versionIncomplete);
    }
    if (is([](const std::string& part) {
            char* end = nullptr;
            return std::strtol(part.c_str(), &end, 10) == 0 && end == part.c_str();
        })) {
        reasons.push_back(Reason::versionNotNumeric);
    }
    if (is([](const std::string& part) {
            const long number = std::strtol(part.c_str(), nullptr, 10);
            return number < 0 || number > 0xFF;
        })) {
        reasons.push_back(Reason::versionOutOfRange);
    }
    if (!reasons.empty()) {
        origin.reasons = reasons;
    }
    return origin;
}

} // namespace orvane::desk
