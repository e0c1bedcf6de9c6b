// SPDX-License-Identifier: Apache-2.0
//
// A simulated unit is a folder that stands for the unit's "/". The product opens absolute paths
// only, so the one honest way to lend it a unit is to change the root directory of the process.
// chroot(2) does that: directly when the process may, else inside a user namespace of its own.
#pragma once

#include "kit/host/descriptor.h"

#include <filesystem>

namespace orvane::kit {

/// While it lives, "/" of this process is `root`, and so is the working directory. The destructor
/// restores both. Works in a single-threaded process only (a user namespace needs that), and cannot
/// be nested. Throws KitError when `root` is not a folder or the system allows neither way, the
/// remedy in its text; the root is then unchanged. A user namespace, once entered, stays for the
/// process's life. Where `root` is "/" already, only the working directory changes, which takes no
/// privilege.
class EnteredRoot {
public:
    explicit EnteredRoot(const std::filesystem::path& root);
    ~EnteredRoot();
    EnteredRoot(const EnteredRoot&) = delete;
    EnteredRoot& operator=(const EnteredRoot&) = delete;

private:
    Descriptor outerRoot_; ///< the former "/"; closed when it is the present one, too
    Descriptor outerCwd_;  ///< the former working directory
};

} // namespace orvane::kit
