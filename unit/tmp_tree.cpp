// SPDX-License-Identifier: Apache-2.0
#include "unit/tmp_tree.h"

#include "kit/root.h"

#include <fstream>
#include <sstream>

namespace orvane::unit {

namespace fs = std::filesystem;

namespace {

constexpr char TMP[] = "/tmp";

std::optional<std::string> readContent(const fs::path& path) {
    std::error_code error;
    if (!fs::is_regular_file(path, error)) {
        return std::nullopt;
    }
    std::ifstream file(path, std::ios::binary);
    std::ostringstream content;
    content << file.rdbuf();
    return content.str();
}

} // namespace

TmpTree readTmp(const fs::path& root) {
    const kit::EnteredRoot entered(root);
    std::error_code error;
    if (!fs::is_directory(TMP, error)) {
        return {};
    }
    TmpTree tree;
    tree.isThere = true;
    for (auto entry = fs::recursive_directory_iterator(TMP, error);
         entry != fs::recursive_directory_iterator(); entry.increment(error)) {
        const std::string path = entry->path().lexically_relative(TMP).string();
        if (entry->is_directory(error)) {
            tree.entries[path + "/"];
        } else {
            tree.entries[path] = readContent(entry->path());
        }
    }
    return tree;
}

} // namespace orvane::unit
