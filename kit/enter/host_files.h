// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "kit/host/unfinished_folder.h"

#include <filesystem>
#include <string>
#include <vector>

namespace orvane::kit {

/// A folder at the top of a unit in which a program finds the files of the host that it is started
/// with: copies of these, at the paths that they have on the host, and nothing else. It is removed
/// with its owner.
class HostFiles {
public:
    /// Makes it, still empty, in the unit at `root`, an absolute path. Throws KitError.
    explicit HostFiles(const std::filesystem::path& root);
    ~HostFiles();
    HostFiles(const HostFiles&) = delete;
    HostFiles& operator=(const HostFiles&) = delete;

    /// Its path on the unit.
    std::string pathInUnit() const;

    /// Copies `files`, relative to the host's "/". For a child process that then becomes the
    /// program: where the system allows mounts, the copies are in memory, and only it and its own
    /// children see them. Throws KitError.
    void fill(const std::vector<std::string>& files) const;

private:
    UnfinishedFolder folder_;
};

} // namespace orvane::kit
