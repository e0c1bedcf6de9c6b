// SPDX-License-Identifier: Apache-2.0
#include "kit/host/finished_folder.h"

#include "kit/host/folder_lock.h"
#include "kit/host/kit_error.h"
#include "kit/host/rename_entry.h"
#include "kit/host/tree_entries.h"
#include "kit/host/unfinished_folder.h"

#include <sys/types.h>

#include <algorithm>
#include <system_error>
#include <vector>

namespace orvane::kit {

namespace {

namespace fs = std::filesystem;

using Fill = std::function<void(const fs::path&)>;

constexpr mode_t ANYBODY = 0777; // less the umask

[[noreturn]] void failAtFolder(const fs::path& folder, const std::error_code& error) {
    throw KitError("cannot make ", folder, ": " + error.message());
}

/// The place of an absent `folder` in an existing one, without links, ending with a name.
fs::path finalPlace(const fs::path& folder) {
    const fs::path plain = folder.has_filename() ? folder : folder.parent_path();
    const fs::path above = plain.parent_path();
    std::error_code error;
    fs::path place = fs::canonical(above.empty() ? "." : above, error) / plain.filename();
    if (error) {
        failAtFolder(folder, error);
    }
    return place;
}

void makeAbsentFolder(const fs::path& folder, const Fill& fill) {
    std::error_code error;
    if (folder.empty()) {
        failAtFolder(folder, std::make_error_code(std::errc::no_such_file_or_directory));
    }
    if (fs::is_symlink(fs::symlink_status(folder, error))) {
        failAtFolder(folder, std::make_error_code(std::errc::file_exists));
    }
    const fs::path place = finalPlace(folder);
    const UnfinishedFolder unfinished(place.parent_path(), place.filename().string(), ANYBODY);
    unfinished.fill(folder, fill);
    error = renameToFree(unfinished.path(), place);
    if (error) {
        failAtFolder(folder, error);
    }
}

/// Requires that `folder` is a folder in which every entry `mayStay`.
template <class Predicate>
void requireEmpty(const fs::path& folder, const Predicate& mayStay) {
    std::error_code error;
    bool isEmpty = fs::is_directory(folder, error);
    if (isEmpty) {
        const std::vector<fs::directory_entry> entries = listFolder(folder);
        isEmpty = std::all_of(entries.begin(), entries.end(), mayStay);
    }
    if (!isEmpty) {
        throw KitError("", folder, " is there already and is not an empty folder");
    }
}

/// Moves everything in `unfinished` to `folder`, `last` at the end; or nothing.
std::error_code moveUp(const fs::path& unfinished, const fs::path& folder,
                       const std::string& last) {
    std::vector<fs::path> names;
    for (const fs::path& entry : listFolder(unfinished)) {
        names.push_back(entry.filename());
    }
    std::stable_partition(names.begin(), names.end(),
                          [&last](const fs::path& name) { return name != last; });
    for (auto name = names.begin(); name != names.end(); ++name) {
        const std::error_code error = renameToFree(unfinished / *name, folder / *name);
        if (error) {
            std::for_each(names.begin(), name, [&](const fs::path& moved) {
                renameToFree(folder / moved, unfinished / moved);
            });
            return error;
        }
    }
    return {};
}

void fillEmptyFolder(const fs::path& folder, const std::string& last, const Fill& fill) {
    const auto isUnfinished = [](const fs::path& entry) {
        return isUnfinishedName(entry.filename().string());
    };
    requireEmpty(folder, isUnfinished);
    const FolderLock lock(folder);
    requireEmpty(folder, isUnfinished); // another process may have filled it
    const UnfinishedFolder unfinished(folder, "unit", ANYBODY);
    unfinished.fill(folder, fill);
    requireEmpty(folder,
                 [&unfinished](const fs::path& entry) { return entry == unfinished.path(); });
    if (const std::error_code error = moveUp(unfinished.path(), folder, last)) {
        failAtFolder(folder, error);
    }
}

} // namespace

void makeFinishedFolder(const fs::path& folder, const std::string& last, const Fill& fill) {
    std::error_code error;
    if (fs::exists(fs::status(folder, error))) {
        fillEmptyFolder(folder, last, fill);
    } else {
        makeAbsentFolder(folder, fill);
    }
}

} // namespace orvane::kit
