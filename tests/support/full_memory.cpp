// SPDX-License-Identifier: Apache-2.0
#include "tests/support/full_memory.h"

#include "tests/support/unit_test.h"

namespace orvane::test {

std::vector<std::string> holeInFullMemory(const std::filesystem::path& root) {
    const std::filesystem::path image(IMAGE_PATH);
    return {"/bin/sh", ORVANE_SUPPORT_DIR "/hole_in_full_memory.sh",
            root / image.parent_path().relative_path(), image.filename()};
}

} // namespace orvane::test
