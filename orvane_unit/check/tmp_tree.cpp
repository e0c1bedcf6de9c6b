// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/check/tmp_tree.h"

#include "kit/enter/entered_root.h"
#include "kit/host/whole_file.h"

#include <system_error>

namespace orvane::desk {

namespace fs = std::filesystem;

namespace {

constexpr char TMP[] = "/tmp";

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
            tree.entries[path] =
                entry->is_regular_file(error) ? kit::readWholeFile(entry->path()) : std::nullopt;
        }
    }
    return tree;
}

} // namespace orvane::desk
