// SPDX-License-Identifier: Apache-2.0
#include "kit/unit/marker.h"

#include "kit/description/unit_layout.h"
#include "kit/host/bytes.h"
#include "kit/host/descriptor.h"
#include "kit/host/host_file.h"
#include "kit/host/kit_error.h"

#include <string>
#include <system_error>

namespace orvane::kit {

namespace fs = std::filesystem;

namespace {

/// What stands in the place of the mark.
fs::file_type kindOfMark(const fs::path& root) {
    const fs::path file = root / MARKER_NAME;
    std::error_code error;
    const fs::file_type kind = fs::symlink_status(file, error).type();
    if (kind == fs::file_type::none) {
        throw KitError("cannot read ", file, ": " + error.message());
    }
    return kind;
}

} // namespace

void markUnit(const fs::path& root) {
    const fs::path file = root / MARKER_NAME;
    writeAt(makeSparseFile(file, 0), file, 0, MARKER_TEXT);
}

bool isKitUnit(const fs::path& root) {
    const fs::path file = root / MARKER_NAME;
    if (kindOfMark(root) != fs::file_type::regular) {
        return false;
    }
    const Descriptor mark = openForReading(file);
    return sizeOf(mark, file) == sizeof MARKER_TEXT - 1 && readWhole(mark, file) == MARKER_TEXT;
}

void requireKitUnit(const fs::path& root) {
    requireFolder(root);
    if (isRootDirectory(root)) {
        throw KitError("", root, " is the root directory of this system, not a unit");
    }
    if (!isKitUnit(root)) {
        const bool isThere = kindOfMark(root) != fs::file_type::not_found;
        throw KitError("", root,
                       std::string(" is not a unit that orvane-unit made: it has ") +
                           (isThere ? "another " : "no file ") + MARKER_NAME);
    }
}

} // namespace orvane::kit
