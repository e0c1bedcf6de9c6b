// SPDX-License-Identifier: Apache-2.0
//
// Conflicts between parts of a description that are each right by themselves: two entries at one
// path, a value past the end of an image or disk.
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

/// A value does not fit into its image, disk or sparse file. Ignores an image or disk that `layout`
/// does not have.
std::optional<Conflict> findSizeConflict(const UnitDescription& unit, const Layout& layout);

} // namespace orvane::kit
