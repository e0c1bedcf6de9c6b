// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tests/support/unit_test.h"

#include <filesystem>
#include <map>
#include <string>

namespace orvane::test {

/// Every entry below a unit's root except the kit's mark: "folder", "link " and its target,
/// "file " and its content, or "other".
inline std::map<std::string, std::string> treeOf(const std::filesystem::path& root) {
    std::map<std::string, std::string> tree;
    for (const auto& entry : std::filesystem::recursive_directory_iterator(root)) {
        const std::string path = "/" + entry.path().lexically_relative(root).string();
        if (path == "/.orvane-unit") {
            continue;
        }
        if (entry.is_symlink()) {
            tree[path] = "link " + std::filesystem::read_symlink(entry.path()).string();
        } else if (entry.is_directory()) {
            tree[path] = "folder";
        } else if (entry.is_regular_file()) {
            tree[path] = "file " + readFile(entry.path());
        } else {
            tree[path] = "other";
        }
    }
    return tree;
}

/// The paths at which two trees differ, so that no whole disk is printed.
inline std::string differenceOf(const std::map<std::string, std::string>& one,
                                const std::map<std::string, std::string>& other) {
    std::string difference;
    for (const auto& [path, content] : one) {
        const auto found = other.find(path);
        if (found == other.end() || found->second != content) {
            difference += path + " ";
        }
    }
    for (const auto& [path, content] : other) {
        difference += one.count(path) == 0 ? path + " " : "";
    }
    return difference;
}

} // namespace orvane::test
