// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "kit/host/unfinished_folder.h"

#include <filesystem>

namespace orvane::kit {

/// A new folder among the system's temporary ones, for this user only, removed with its owner.
class ScratchFolder {
public:
    /// Throws KitError.
    ScratchFolder();

    const std::filesystem::path& path() const { return folder_.path(); }

private:
    UnfinishedFolder folder_;
};

} // namespace orvane::kit
