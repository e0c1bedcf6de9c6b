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

/// Two mounts that this process and its children see, and no others. Only if this process is in a
/// changed root itself may a mount be visible outside, too; whoever made its folder then unmounts
/// it. Each is false when the system does not allow mounts, or there is no such folder.

/// Puts an empty file system in memory over `folder`.
bool mountMemory(const std::filesystem::path& folder);

/// Shows the host's /proc at `root`/proc. That is a way from the unit to the host: only for the
/// project's own tests.
bool showProc(const std::filesystem::path& root);

} // namespace orvane::kit
