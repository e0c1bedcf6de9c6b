// SPDX-License-Identifier: Apache-2.0
#include "platform/shared_memory.h"

#include <sys/mman.h>

namespace orvane {
namespace platform {

int openSharedMemory(const char* name, int flags, mode_t mode) {
    return shm_open(name, flags, mode);
}

} // namespace platform
} // namespace orvane
