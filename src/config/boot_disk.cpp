// SPDX-License-Identifier: Apache-2.0
#include "config/boot_disk.h"

#include <fcntl.h>
#include <unistd.h>

namespace orvane {

BootDisk::BootDisk(int flags) : descriptor_(open64(BOOT_DISK, flags)) {}

BootDisk::~BootDisk() {
    if (isOpen()) {
        close(descriptor_);
    }
}

bool BootDisk::seekFromEnd(std::int64_t bytesBeforeEnd) const {
    return isOpen() && lseek64(descriptor_, -bytesBeforeEnd, SEEK_END) != -1;
}

bool BootDisk::read(void* buffer, std::uint32_t length) const {
    return ::read(descriptor_, buffer, length) != -1;
}

bool BootDisk::write(const void* buffer, std::uint32_t length) const {
    return ::write(descriptor_, buffer, length) != -1;
}

} // namespace orvane
