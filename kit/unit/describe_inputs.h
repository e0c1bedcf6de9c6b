// SPDX-License-Identifier: Apache-2.0
//
// All that a run of the tool reads in a unit, whoever made it.
#pragma once

#include "kit/description/unit_description.h"
#include "kit/host/bytes.h"

#include <filesystem>
#include <optional>
#include <string>

namespace orvane::kit {

struct UnitInputs {
    UnitDescription unit;       ///< everything but what image and disk hold
    std::optional<Bytes> image; ///< unless it is longer than LONGEST_IMAGE, and a file of `unit`
    std::optional<Bytes> disk;  ///< the disk's last mebibyte, or all of a shorter one
};

/// Reads the inputs of the unit at `source`, as describeInputs says. Throws KitError.
UnitInputs readInputs(const std::filesystem::path& source);

/// The inputs as one description.
UnitDescription descriptionOf(UnitInputs inputs);

/// What a run of the tool reads in the unit at `source` ("/", or a mounted image of a unit; the kit
/// need not have made it), as a description of a unit in which a run does the same:
///  - the configuration image, and the last mebibyte of the boot disk, or all of a shorter one;
///  - the files of the version folder that the tool takes for version descriptions;
///  - templates and stock files. Links are followed inside the source. What is missing there, or
///    can't be opened by anybody, is missing in the description, folders included; a version file
///    that is listed and can't be opened becomes a link to itself, which can't be either. A folder
///    in the place of a file is a folder. Outputs are left out, except that one that a run can't
///    open becomes a folder, and that templates, stock files and outputs that are one file are
///    links to one of them if an output is among them. Not kept are links between an output and any
///    other input, and the order of the version folder's listing, which is the file system's. Never
///    writes. Throws KitError when the source can't be entered, or nobody can tell what a run would
///    read in it or where it would wait.
UnitDescription describeInputs(const std::filesystem::path& source);

} // namespace orvane::kit
