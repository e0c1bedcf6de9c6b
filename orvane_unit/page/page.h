// SPDX-License-Identifier: Apache-2.0
//
// A page to look at: one HTML file about one or more units. It needs no other file and no network,
// its policy forbids everything but its own style and script, and it reads without both. An
// element that shows a value of a unit, or what is made of one, has the value's key (`data-key`).
#pragma once

#include "orvane_unit/compare/impact.h"
#include "orvane_unit/explain/explanation.h"
#include "orvane_unit/show/decoded_unit.h"

#include <filesystem>
#include <optional>
#include <string>
#include <vector>

namespace orvane::desk {

/// A unit of a page.
struct PageUnit {
    std::string name;
    Explanation explanation;
    DecodedUnit decoded;
    std::optional<std::vector<Impact>> impacts; ///< none if nobody asked for them
};

/// Requires that nothing but an earlier page, or nothing at all, is at `file`: a wrong word after
/// -o must not cost a unit or a description. Throws kit::KitError.
void requireReplaceable(const std::filesystem::path& file);

/// Requires that `file` is in none of the folders `units`, which a page in them would change; "/"
/// holds every file and is passed over. Throws kit::KitError.
void requireOutside(const std::filesystem::path& file,
                    const std::vector<std::filesystem::path>& units);

/// The page about `units`, of which there must be one, after a run with the options `letters`. It
/// says so if the units are copies without serials.
std::string pageText(const std::vector<PageUnit>& units, const std::string& letters,
                     bool isRedacted = false);

} // namespace orvane::desk
