// SPDX-License-Identifier: Apache-2.0
//
// A simulated unit is a folder that stands for the unit's "/". The product opens absolute paths
// only, so the one honest way to give it a unit is to change the root directory of the process: by
// chroot(2), directly if the process may, else inside a user namespace of its own.
#pragma once

#include "kit/host/descriptor.h"

#include <filesystem>

namespace orvane::kit {

/// While it exists, "/" and the working directory of this process are `root`. The destructor
/// restores both. Works in a single-threaded process only (a user namespace needs that), and cannot
/// be nested. Throws KitError, with the remedy, when `root` is not a folder or the system allows
/// neither; the root is then unchanged. A user namespace, once entered, stays until the process
/// ends. If `root` is "/" already, only the working directory changes, which needs no privilege.
class EnteredRoot {
public:
    explicit EnteredRoot(const std::filesystem::path& root);
    ~EnteredRoot();
    EnteredRoot(const EnteredRoot&) = delete;
    EnteredRoot& operator=(const EnteredRoot&) = delete;

    /// Whether the root was "/" already: the unit is the system that runs, not a copy of one.
    bool isRunningSystem() const { return !outerRoot_.isOpen(); }

private:
    Descriptor outerRoot_; ///< the former "/"; closed when it is the present one, too
    Descriptor outerCwd_;  ///< the former working directory
};

} // namespace orvane::kit
