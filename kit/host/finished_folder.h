// SPDX-License-Identifier: Apache-2.0
//
// A folder that is complete or not there.
#pragma once

#include <filesystem>
#include <functional>
#include <string>

namespace orvane::kit {

/// Lets `fill` fill an empty folder, which then becomes `folder`; that must be absent or an empty
/// folder. The unfinished folder is an UnfinishedFolder.
///  - If `folder` is absent, the unfinished folder lies next to it and is renamed to it.
///  - An empty `folder` may be a mount point, somebody's working directory, or in a folder that
///    can't be written: it stays, locked meanwhile. The unfinished folder lies in it, and its
///    entries are moved up, `last` after all others: while that is missing, the folder is not
///    complete.
///
/// What `fill` throws is thrown on as UnfinishedFolder::fill says; the unfinished folder is then
/// removed and `folder` is as it was. Also throws KitError when `folder` is anything but absent or
/// empty, or the system refuses.
void makeFinishedFolder(const std::filesystem::path& folder, const std::string& last,
                        const std::function<void(const std::filesystem::path&)>& fill);

} // namespace orvane::kit
