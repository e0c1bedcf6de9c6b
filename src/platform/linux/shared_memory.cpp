// SPDX-License-Identifier: Apache-2.0
#include "platform/shared_memory.h"

#include <fcntl.h>
#include <sys/mman.h>

#include <cerrno>

namespace orvane {
namespace platform {

int openSharedMemory(const char* name, int flags, mode_t mode) {
    const int descriptor = shm_open(name, flags, mode);
    // Linux C libraries keep their objects in one flat folder and refuse a name with inner slashes.
    if (descriptor == -1 && errno == EINVAL) {
        return open(name, flags, mode);
    }
    return descriptor;
}

} // namespace platform
} // namespace orvane
