// SPDX-License-Identifier: Apache-2.0
//
// A folder that one process at a time changes. The system releases a lock with the end of the
// process that holds it, however it ends.
#pragma once

#include "kit/host/descriptor.h"

#include <filesystem>

namespace orvane::kit {

enum class LockState {
    taken,
    heldByAnother,
    impossible, ///< the file system has no locks
};

/// Tries to lock the folder that `descriptor` has open, until it is closed.
LockState tryLock(const Descriptor& descriptor);

/// While it exists, no other process has a lock on the folder. Where the file system has no locks,
/// it does nothing.
class FolderLock {
public:
    /// Waits about two seconds for the present holder. Throws KitError when that is not enough,
    /// with the holder's process number if the system tells it, or when `folder` can't be opened.
    explicit FolderLock(const std::filesystem::path& folder);
    ~FolderLock() { descriptor_.close(); }
    FolderLock(const FolderLock&) = delete;
    FolderLock& operator=(const FolderLock&) = delete;

private:
    Descriptor descriptor_;
};

} // namespace orvane::kit
