// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/check/tmp_tree.h"

#include "kit/enter/entered_root.h"
#include "kit/host/bytes.h"
#include "kit/host/tree_entries.h"
#include "kit/host/whole_file.h"
#include "main/unit_files.h"

#include <vector>

namespace orvane::desk {

namespace fs = std::filesystem;

namespace {

/// Adds the entries of `folder` and returns the folders among them; links are not followed.
std::vector<fs::path> readFolder(const fs::path& folder, TmpTree& tree) {
    std::vector<fs::path> folders;
    for (const fs::path& entry : kit::listFolder(folder)) {
        const std::string path = entry.lexically_relative(OUTPUT_FOLDER).string();
        const fs::file_type kind = kit::kindBehind(entry);
        if (kind == fs::file_type::directory) {
            tree.entries[path + "/"];
            if (kit::kindOf(entry) == fs::file_type::directory) {
                folders.push_back(entry);
            }
        } else if (kind == fs::file_type::regular) {
            tree.entries[path] = kit::readWholeFile(entry);
        } else {
            tree.entries[path];
        }
    }
    return folders;
}

} // namespace

std::string pathInTmp(const std::string& name) {
    return std::string(OUTPUT_FOLDER) + "/" + name;
}

TmpTree readTmp(const fs::path& root) {
    const kit::EnteredRoot entered(root);
    TmpTree tree;
    tree.isThere = kit::kindBehind(OUTPUT_FOLDER) == fs::file_type::directory;
    std::vector<fs::path> unread;
    if (tree.isThere) {
        unread.emplace_back(OUTPUT_FOLDER);
    }
    while (!unread.empty()) {
        const fs::path folder = unread.back();
        unread.pop_back();
        const std::vector<fs::path> inside = readFolder(folder, tree);
        unread.insert(unread.end(), inside.begin(), inside.end());
    }
    return tree;
}

} // namespace orvane::desk
