// SPDX-License-Identifier: Apache-2.0
//
// What the unit itself refuses to hold. Each check throws KitError with what would be right; the
// caller knows where the value came from.
#pragma once

#include "kit/description/unit_description.h"
#include "kit/host/bytes.h"
#include "kit/tuning/tuning_description.h"

#include <cstdint>
#include <string>

namespace orvane::kit {

/// There is such a parameter, and `value` fits into its one or two bytes.
void checkParam(std::uint16_t number, std::int64_t value);

/// There is such a record slot, and it takes `bytes`: at least one, not more than its size. The
/// product's own writer would drop the excess without a word.
void checkSlot(std::uint32_t slot, const Bytes& bytes);

/// The auxiliary area takes `bytes`.
void checkAux(const Bytes& bytes);

/// There is such a tuning block, and it takes `block`.
void checkTuning(std::uint32_t id, const TuningDescription& block);

/// `path` is absolute, names something, has no ".", ".." or needless slash, and is not the kit's
/// own mark (marker.h) nor anything below it.
void checkUnitPath(const std::string& path);

/// `target` is a text that a symbolic link can hold.
void checkLinkTarget(const std::string& target);

/// All of the above for everything in `unit`.
void checkUnit(const UnitDescription& unit);

} // namespace orvane::kit
