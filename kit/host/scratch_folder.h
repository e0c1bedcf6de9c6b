// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <filesystem>

namespace orvane::kit {

/// A new folder among the system's temporary ones, removed with its owner.
class ScratchFolder {
public:
    /// Throws KitError.
    ScratchFolder();
    ~ScratchFolder();
    ScratchFolder(const ScratchFolder&) = delete;
    ScratchFolder& operator=(const ScratchFolder&) = delete;

    const std::filesystem::path& path() const { return path_; }

private:
    std::filesystem::path path_;
};

} // namespace orvane::kit
