// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tests/support/folder_names.h"

#include <cstddef>

namespace orvane::test {

/// How many descriptors this process has open. Reads the host's /proc: not for use inside a unit.
inline std::size_t openDescriptors() {
    return folderNames("/proc/self/fd").size();
}

} // namespace orvane::test
