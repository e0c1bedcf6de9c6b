// SPDX-License-Identifier: Apache-2.0
//
// From what stands on the command line to the units of a page.
#pragma once

#include "orvane_unit/compare/impact.h"
#include "orvane_unit/page/page.h"

#include <filesystem>
#include <string>
#include <vector>

namespace orvane::desk {

struct PageRequest {
    std::vector<std::string> roots; ///< units, descriptions, or folders of these
    std::string letters;            ///< the tool's options
    bool redactsSerial = false;
    bool hasImpacts = false;
};

/// The folders of units among what `roots` stand for, as in readPageUnits.
std::vector<std::filesystem::path> unitFolders(const std::vector<std::string>& roots);

/// Reads all units that `request` names. A folder that is not a unit stands for the units and
/// descriptions (*.toml) in it, in the order of their names. Units are only read; descriptions are
/// made, and serials replaced as by kit::captureUnit, in temporary folders. `progress` counts
/// units, or the inputs of a single one. Throws kit::KitError, which names the unit, also for a
/// root that holds nothing that the tool opens, and for a unit that holds the serial of another one
/// whose serial is to be replaced.
std::vector<PageUnit> readPageUnits(const PageRequest& request, const Progress& progress);

} // namespace orvane::desk
