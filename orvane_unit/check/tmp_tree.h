// SPDX-License-Identifier: Apache-2.0
//
// What is in a unit's /tmp.
#pragma once

#include <filesystem>
#include <map>
#include <optional>
#include <string>
#include <utility>

namespace orvane::desk {

struct TmpTree {
    bool isThere = false; ///< there is a /tmp
    /// By path relative to /tmp: the content of a file, links followed inside the unit; nothing for
    /// a folder, whose path ends with a slash, or anything else.
    std::map<std::string, std::optional<std::string>> entries;

    bool hasFolder(const std::string& path) const { return entries.count(path + "/") != 0; }
    /// The content of a file; nothing when there is none.
    std::optional<std::string> file(const std::string& path) const {
        const auto entry = entries.find(path);
        return entry == entries.end() ? std::nullopt : entry->second;
    }
};

/// The path on the unit of an entry of a TmpTree.
std::string pathInTmp(const std::string& name);

/// Throws kit::KitError when the root can't be entered, or a folder or file can't be read.
TmpTree readTmp(const std::filesystem::path& root);

} // namespace orvane::desk
