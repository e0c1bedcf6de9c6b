// SPDX-License-Identifier: Apache-2.0
//
// The limits of the unit itself. Each check throws KitError with what would be right; the caller
// knows where the value came from.
#pragma once

#include "kit/description/unit_description.h"
#include "kit/host/bytes.h"
#include "kit/tuning/tuning_description.h"

#include <cstdint>
#include <string>

namespace orvane::kit {

/// Parameter `number` exists, and `value` fits into its one or two bytes.
void checkParam(std::uint16_t number, std::int64_t value);

/// Record slot `slot` exists, and has room for `bytes`, of which there is at least one. The
/// product's own writer would silently drop the excess.
void checkSlot(std::uint32_t slot, const Bytes& bytes);

/// The same for the auxiliary area.
void checkAux(const Bytes& bytes);

/// Tuning block `id` exists and can hold `block`.
void checkTuning(std::uint32_t id, const TuningDescription& block);

/// `path` is absolute, names something, has no ".", "..", needless slash or zero byte, and is not
/// the kit's own mark (marker.h) nor anything below it.
void checkUnitPath(const std::string& path);

/// A symbolic link can have this target.
void checkLinkTarget(const std::string& target);

/// All of the above for everything in `unit`.
void checkUnit(const UnitDescription& unit);

} // namespace orvane::kit
