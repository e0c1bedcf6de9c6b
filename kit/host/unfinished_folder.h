// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "kit/host/descriptor.h"
#include "kit/host/interruption.h"

#include <sys/types.h>

#include <filesystem>
#include <functional>
#include <string>

namespace orvane::kit {

/// A new folder that is removed with its owner, unless it has been renamed by then. Its name is "."
/// + a stem + ".unfinished-", the number of this process, "-" and a number. SIGINT, SIGTERM and
/// SIGHUP wait while it exists. A process that is killed leaves it behind, without the lock that
/// each such folder has: removeLeftovers() removes it.
class UnfinishedFolder {
public:
    /// Makes it in the folder `above`, from which it first removes the leftovers, with the access
    /// rights `mode`, less the umask. Throws KitError.
    UnfinishedFolder(const std::filesystem::path& above, const std::string& stem, mode_t mode);
    ~UnfinishedFolder();
    UnfinishedFolder(const UnfinishedFolder&) = delete;
    UnfinishedFolder& operator=(const UnfinishedFolder&) = delete;

    const std::filesystem::path& path() const { return path_; }

    /// Lets `fillIt` fill it, as the folder that is to become `future`. What that throws is thrown
    /// on: a failure of the file system as KitError, and a KitError about a path in this folder as
    /// one about the future path.
    void fill(const std::filesystem::path& future,
              const std::function<void(const std::filesystem::path&)>& fillIt) const;

private:
    DeferredInterruption deferred_; ///< first, so that it ends last
    std::filesystem::path path_;
    Descriptor lock_;
};

/// Removes the unfinished folders in `above` that killed processes of this user have left: those on
/// which no process has a lock. What can't be listed, locked or removed stays.
void removeLeftovers(const std::filesystem::path& above);

/// Whether an entry's name is that of an unfinished folder.
bool isUnfinishedName(const std::string& name);

} // namespace orvane::kit
