// SPDX-License-Identifier: Apache-2.0
//
// A folder that is complete or not there.
#pragma once

#include <filesystem>
#include <functional>

namespace orvane::kit {

/// Lets `fill` fill an empty folder next to `folder`, then renames it to `folder`, which must be
/// absent or an empty folder. The unfinished folder is named "." + the folder's name +
/// ".unfinished-" and a number, and has the access rights that an empty `folder` had. What `fill`
/// throws is thrown on: a failure of the file system as KitError, and a KitError about a path of
/// the unfinished folder as one about the final path. The unfinished folder is then removed and
/// `folder` is as it was. Also throws KitError when `folder` is anything but absent or empty, or
/// the system refuses.
void makeFinishedFolder(const std::filesystem::path& folder,
                        const std::function<void(const std::filesystem::path&)>& fill);

} // namespace orvane::kit
