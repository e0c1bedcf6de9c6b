// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <sys/types.h>

namespace orvane {
namespace platform {

/// shm_open(3) as the unit's system has it: a `name` that is a full path, with inner slashes, is
/// opened as that path. Returns the descriptor, or -1 with errno set.
int openSharedMemory(const char* name, int flags, mode_t mode);

} // namespace platform
} // namespace orvane
