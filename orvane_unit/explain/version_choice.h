// SPDX-License-Identifier: Apache-2.0
//
// The version description files of a unit, and how one of them becomes the firmware version.
#pragma once

#include "identity/inf_file.h"
#include "orvane_unit/explain/explanation.h"

#include <cstddef>
#include <optional>
#include <string>
#include <vector>

namespace orvane::desk {

struct VersionFile {
    std::string path;
    Inf_Data record;
    bool isApplication = false;
};

/// All version description files of the unit that the process has as its root, in the order of the
/// directory listing.
struct VersionFiles {
    bool hasFolder = false;
    std::vector<VersionFile> files;
    std::optional<std::size_t> chosen; ///< the first application
};

/// Throws kit::KitError where nobody can tell what a run reads.
VersionFiles readVersionFiles();

/// The origin of the version as a text, in the two iAP2 files.
Origin versionTextOrigin(const VersionFiles& versions);

/// The origin of the six digits in the iAP1 file.
Origin versionDigitsOrigin(const VersionFiles& versions);

} // namespace orvane::desk
