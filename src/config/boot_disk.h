// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>

namespace orvane {

constexpr char BOOT_DISK[] = "/dev/hd0";

/// The raw boot disk, open for one transfer at a position counted from its end. Owns the
/// descriptor.
class BootDisk {
public:
    /// Opens the device with `flags` (O_RDONLY or O_WRONLY).
    explicit BootDisk(int flags);
    ~BootDisk();
    BootDisk(const BootDisk&) = delete;
    BootDisk& operator=(const BootDisk&) = delete;

    bool isOpen() const { return descriptor_ != -1; }

    /// Goes to `bytesBeforeEnd` bytes before the end of the device. False when the device is
    /// closed, or has no such position.
    bool seekFromEnd(std::int64_t bytesBeforeEnd) const;

    /// One read or write of `length` bytes at the position of the last seek. False when it fails; a
    /// short transfer is not a failure.
    bool read(void* buffer, std::uint32_t length) const;
    bool write(const void* buffer, std::uint32_t length) const;

private:
    int descriptor_;
};

} // namespace orvane
