// SPDX-License-Identifier: Apache-2.0
#include "kit/unit/marker.h"

#include "kit/description/unit_layout.h"
#include "kit/host/bytes.h"
#include "kit/host/host_file.h"
#include "kit/host/kit_error.h"

#include <sys/stat.h>

#include <string>
#include <system_error>

namespace orvane::kit {

namespace fs = std::filesystem;

void markUnit(const fs::path& root) {
    const fs::path file = root / MARKER_NAME;
    writeAt(makeSparseFile(file, 0), file, 0, MARKER_TEXT);
}

bool isKitUnit(const fs::path& root) {
    const fs::path file = root / MARKER_NAME;
    struct stat state {};
    if (::lstat(file.c_str(), &state) != 0 || !S_ISREG(state.st_mode) ||
        state.st_size != sizeof MARKER_TEXT - 1) {
        return false;
    }
    try {
        return readWhole(openForReading(file), file) == MARKER_TEXT;
    } catch (const KitError&) {
        return false;
    }
}

void requireKitUnit(const fs::path& root) {
    std::error_code error;
    if (!fs::is_directory(root, error)) {
        throw KitError("", root, " is not a folder");
    }
    if (isRootDirectory(root)) {
        throw KitError("", root, " is the root directory of this system, not a unit");
    }
    if (!isKitUnit(root)) {
        throw KitError(root.string() + " is not a unit that orvane-unit made: it has no file " +
                       MARKER_NAME);
    }
}

} // namespace orvane::kit
