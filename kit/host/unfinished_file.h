// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "kit/host/bytes.h"
#include "kit/host/unfinished_folder.h"

#include <filesystem>

namespace orvane::kit {

/// A file that is written whole, in one step, or not at all. Until then, what is at its path stays
/// as it is.
class UnfinishedFile {
public:
    /// Makes sure that there can be a file at `file`, which may be there already. Throws KitError,
    /// also when something else than a file is there.
    explicit UnfinishedFile(const std::filesystem::path& file);

    /// Puts a file of `bytes` there. Throws KitError.
    void finish(const Bytes& bytes) const;

private:
    std::filesystem::path file_; ///< without a link as its last name, unless it leads nowhere
    UnfinishedFolder folder_;    ///< next to it
};

} // namespace orvane::kit
