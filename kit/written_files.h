// SPDX-License-Identifier: Apache-2.0
//
// Which files a run has written, told by the marks that a file system keeps of every change.
#pragma once

#include <cstdint>
#include <filesystem>
#include <map>
#include <string>
#include <vector>

namespace orvane::kit {

/// What changes when a file is written or replaced.
struct FileMark {
    std::uint64_t inode;
    std::int64_t size;     ///< bytes
    std::int64_t modified; ///< nanoseconds
    std::int64_t changed;  ///< nanoseconds

    bool operator==(const FileMark& other) const {
        return inode == other.inode && size == other.size && modified == other.modified &&
               changed == other.changed;
    }
};

/// The regular files below a folder, by their path relative to it.
using Snapshot = std::map<std::string, FileMark>;

/// The files below `folder` as they are; none when there is no such folder.
Snapshot takeSnapshot(const std::filesystem::path& folder);

/// Waits until a file written from now on gets another mark than any file written before.
void awaitNewMarks();

/// The files of `after` that are new or changed, in the order of their paths.
std::vector<std::string> writtenBetween(const Snapshot& before, const Snapshot& after);

} // namespace orvane::kit
