// SPDX-License-Identifier: Apache-2.0
//
// Faults of a description that show only between its parts, each of them right by itself: two
// entries in one place, a value behind the end of an image or disk.
#pragma once

#include "kit/description/unit_description.h"
#include "kit/description/unit_layout.h"
#include "kit/description/value_key.h"

#include <optional>
#include <string>

namespace orvane::kit {

/// The value at fault, and what is wrong with it.
struct Conflict {
    ValueKey key;
    std::string what;
};

/// A path is named twice, or lies below a file or link.
std::optional<Conflict> findPathConflict(const UnitDescription& unit);

/// A value of image, disk or sparse file does not fit into it. What `layout` has no place for is
/// not looked at.
std::optional<Conflict> findSizeConflict(const UnitDescription& unit, const Layout& layout);

} // namespace orvane::kit
