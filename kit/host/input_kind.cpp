// SPDX-License-Identifier: Apache-2.0
#include "kit/host/input_kind.h"

#include "kit/host/descriptor.h"
#include "kit/host/host_file.h"
#include "kit/host/kit_error.h"
#include "kit/host/tree_entries.h"

#include <unistd.h>

#include <filesystem>

namespace orvane::kit {

namespace {

namespace fs = std::filesystem;

InputKind lookAtInput(const std::string& path) {
    const fs::file_type type = kindBehind(path);
    if (type == fs::file_type::not_found || type == fs::file_type::socket) {
        return InputKind::missing;
    }
    if (type == fs::file_type::fifo) {
        throw KitError("", path, " is a pipe: a run waits there for its other end");
    }
    if (type != fs::file_type::regular && type != fs::file_type::directory) {
        return InputKind::device;
    }
    openForReading(path); // throws if this process may not
    return type == fs::file_type::regular ? InputKind::file : InputKind::folder;
}

bool canBeMeasured(const Descriptor& device) {
    return ::lseek(device.number(), 0, SEEK_END) != -1;
}

/// A device without positions, such as /dev/zero, tells no size and still takes any seek.
bool hasPositions(const Descriptor& device) {
    const off_t size = ::lseek(device.number(), 0, SEEK_END);
    return size > 0 || (size == 0 && ::lseek(device.number(), -1, SEEK_END) == -1);
}

/// Throws KitError for a device that is not `isUsable`.
InputKind lookAtSeekableInput(const std::string& path, bool (*isUsable)(const Descriptor&)) {
    const InputKind kind = lookAtInput(path);
    if (kind == InputKind::device && !isUsable(openForReading(path))) {
        throw KitError("", path,
                       " is a device without positions: only a run can tell what it yields");
    }
    return kind;
}

} // namespace

InputKind lookAtSequentialInput(const std::string& path) {
    const InputKind kind = lookAtInput(path);
    if (kind == InputKind::device) {
        throw KitError("", path, " is a device: only a run can tell what it yields");
    }
    return kind;
}

InputKind lookAtMappedInput(const std::string& path) {
    return lookAtSeekableInput(path, canBeMeasured);
}

InputKind lookAtPositionedInput(const std::string& path) {
    return lookAtSeekableInput(path, hasPositions);
}

} // namespace orvane::kit
