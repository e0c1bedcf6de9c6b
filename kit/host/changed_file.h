// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "kit/host/bytes.h"
#include "kit/host/descriptor.h"

#include <cstdint>
#include <filesystem>

namespace orvane::kit {

/// A regular file, open to be changed in place without changing its length.
class ChangedFile {
public:
    /// Opens `path`, links followed. Throws KitError if it is not a regular file or can't be
    /// opened.
    explicit ChangedFile(std::filesystem::path path);

    std::uint64_t size() const;
    /// `length` bytes from `offset` on, which must lie in the file.
    Bytes read(std::uint64_t offset, std::uint64_t length) const;
    /// Makes sure that a write there has the room that it needs: on the disk, since a hole takes
    /// none, and below the limit that this process has for files. Changes no byte.
    void reserve(std::uint64_t offset, std::uint64_t length) const;
    void write(std::uint64_t offset, const Bytes& bytes) const;

private:
    std::filesystem::path path_;
    Descriptor descriptor_;
};

} // namespace orvane::kit
