// SPDX-License-Identifier: Apache-2.0
#include "kit/host/output_place.h"

#include "kit/host/kit_error.h"
#include "kit/host/tree_entries.h"

#include <sys/stat.h>
#include <sys/statvfs.h>

#include <cerrno>
#include <deque>
#include <filesystem>

namespace orvane::kit {

namespace {

namespace fs = std::filesystem;

/// How many links the kernel follows in one path.
constexpr int MOST_LINKS = 40;

/// The name `name` in a folder, its link not followed; nothing when there can't be such a name.
std::optional<OutputPlace> lookInFolder(const std::string& folder, const fs::path& name) {
    const fs::path entry = fs::path(folder) / name;
    struct stat state {};
    if (::lstat(entry.c_str(), &state) == 0) {
        return OutputPlace{entry.string(), state.st_mode & S_IFMT};
    }
    if (errno == ENOENT) {
        return OutputPlace{entry.string(), 0};
    }
    if (errno == ENAMETOOLONG) {
        return std::nullopt;
    }
    throw systemError("cannot read ", entry);
}

bool isOnReadOnlyMount(const OutputPlace& place) {
    const fs::path path = place.path;
    const fs::path there = place.kind == 0 ? path.parent_path() : path;
    struct statvfs mount {};
    if (::statvfs(there.c_str(), &mount) != 0) {
        throw systemError("cannot read ", there);
    }
    return (mount.f_flag & ST_RDONLY) != 0;
}

} // namespace

std::optional<OutputPlace> findOutputPlace(const std::string& path) {
    const fs::path whole = path;
    std::deque<fs::path> names(whole.begin(), whole.end());
    OutputPlace place;
    int links = 0;
    while (!names.empty()) {
        const fs::path name = names.front();
        names.pop_front();
        if (name.has_root_directory()) {
            place = {"/", S_IFDIR};
        } else if (place.kind != S_IFDIR) {
            return std::nullopt;
        } else if (name == "..") {
            place.path = fs::path(place.path).parent_path();
        } else if (!name.empty() && name != ".") {
            const std::optional<OutputPlace> next = lookInFolder(place.path, name);
            if (!next || (next->kind == S_IFLNK && ++links > MOST_LINKS)) {
                return std::nullopt;
            }
            if (next->kind == S_IFLNK) {
                const fs::path target = targetOf(next->path);
                names.insert(names.begin(), target.begin(), target.end());
            } else {
                place = *next;
            }
        }
    }
    return place;
}

std::string fileName(const OutputPlace& place) {
    struct stat state {};
    if (place.kind == 0 || ::stat(place.path.c_str(), &state) != 0) {
        return place.path;
    }
    return std::to_string(state.st_dev) + ":" + std::to_string(state.st_ino);
}

bool keepsBytes(const OutputPlace& place) {
    return place.kind == 0 || place.kind == S_IFREG;
}

bool canBeOpened(const OutputPlace& place, bool isRunningSystem) {
    switch (place.kind) {
    case S_IFDIR:
    case S_IFSOCK:
        return false;
    case S_IFIFO:
        throw KitError("", place.path, " is a pipe: a run waits there for its other end");
    case S_IFREG:
    case 0:
        return !isRunningSystem || !isOnReadOnlyMount(place);
    default:
        return true;
    }
}

bool canBeOpened(const std::string& path, bool isRunningSystem) {
    const std::optional<OutputPlace> place = findOutputPlace(path);
    return place && canBeOpened(*place, isRunningSystem);
}

} // namespace orvane::kit
