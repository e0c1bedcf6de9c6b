// SPDX-License-Identifier: Apache-2.0
//
// What is at the path of an input. All functions look before anything is opened, so that nobody
// waits at a pipe, and tell what is missing from what this process may not read: on a unit the tool
// may read everything.
#pragma once

#include <string>

namespace orvane::kit {

enum class InputKind {
    missing, ///< nothing, or what can't be opened: a link that leads nowhere, a socket
    file,
    folder,
    device,
};

/// Looks at an input that a run reads from its start to its end. Never a device. Throws KitError
/// for a pipe or a device, from which nobody knows what a run would read, and for what this process
/// may not read.
InputKind lookAtSequentialInput(const std::string& path);

/// The same for an input that a run measures and maps, as the image. A device is refused only if it
/// can't be measured.
InputKind lookAtMappedInput(const std::string& path);

/// The same for an input that a run reads at positions before its end, as the disk. A device is
/// refused only if it has no positions: it may yield other bytes each time.
InputKind lookAtPositionedInput(const std::string& path);

} // namespace orvane::kit
