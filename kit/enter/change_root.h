// SPDX-License-Identifier: Apache-2.0
//
// The change of the root directory, with or without the privilege for it. Without it, the process
// enters a user namespace in which its own user is root, and stays there until it ends.
#pragma once

#include <filesystem>

namespace orvane::kit {

/// Makes `root` the root directory of this process and leaves the working directory where it is.
/// Throws KitError when `root` is not a folder or the system allows neither.
void changeRoot(const std::filesystem::path& root);

/// Lets this process, and no other but its children, see the host's /proc at `root`/proc. False
/// when that is not a folder or the system does not allow mounts. Only if this process is in a
/// changed root itself may the mount be visible outside, too; whoever made the folder then removes
/// it.
bool showProc(const std::filesystem::path& root);

} // namespace orvane::kit
