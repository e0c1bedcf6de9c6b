// SPDX-License-Identifier: Apache-2.0
#include "kit/host/tree_entries.h"

#include "kit/host/kit_error.h"

#include <algorithm>
#include <system_error>

namespace orvane::kit {

namespace {

namespace fs = std::filesystem;

/// Throws KitError for a failure at `path`.
void check(const std::error_code& error, const fs::path& path) {
    if (error) {
        throw KitError("cannot read ", path, ": " + error.message());
    }
}

} // namespace

std::vector<fs::directory_entry> listFolder(const fs::path& folder) {
    std::error_code error;
    std::vector<fs::directory_entry> entries;
    for (fs::directory_iterator entry(folder, error); entry != fs::directory_iterator();
         entry.increment(error)) {
        check(error, folder);
        entries.push_back(*entry);
    }
    check(error, folder);
    std::sort(entries.begin(), entries.end());
    return entries;
}

fs::file_type kindOf(const fs::path& entry) {
    std::error_code error;
    const fs::file_status status = fs::symlink_status(entry, error);
    check(error, entry);
    return status.type();
}

fs::file_type kindBehind(const fs::path& entry) {
    std::error_code error;
    const fs::file_type type = fs::status(entry, error).type();
    if (type != fs::file_type::none) {
        return type;
    }
    if (error == std::errc::too_many_symbolic_link_levels ||
        error == std::errc::filename_too_long) {
        return fs::file_type::not_found;
    }
    throw KitError("cannot read ", entry, ": " + error.message());
}

std::string nounOf(fs::file_type kind) {
    return kind == fs::file_type::regular     ? "a file"
           : kind == fs::file_type::directory ? "a folder"
           : kind == fs::file_type::symlink   ? "a link"
           : kind == fs::file_type::fifo      ? "a pipe"
           : kind == fs::file_type::socket    ? "a socket"
                                              : "a device";
}

std::string targetOf(const fs::path& link) {
    std::error_code error;
    std::string target = fs::read_symlink(link, error).string();
    check(error, link);
    return target;
}

} // namespace orvane::kit
