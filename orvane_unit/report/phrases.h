// SPDX-License-Identifier: Apache-2.0
//
// Words for parts of a decoded unit, the same in every report.
#pragma once

#include "orvane_unit/compare/impact.h"
#include "orvane_unit/explain/version_choice.h"

#include <cstddef>
#include <cstdint>
#include <string>

namespace orvane::desk {

/// Stands where a line would be that was left out.
constexpr char LEFT_OUT[] = "(left out)";

/// "0x00ff": at least `digits` digits.
std::string hexNumber(std::uint32_t number, unsigned digits);

/// "slots 1 to 9": what `slot` repeats; empty for a slot that repeats none.
std::string repeatedSlots(std::uint32_t slot);

/// What the tool reads the tuning block for; empty for a block that it does not read.
std::string purposeOf(std::int32_t blockId);

/// "/tmp/airplay.conf:5"; "/tmp/airplay.conf" for the whole output.
std::string lineText(const OutputLine& line);

/// Whether the version description file `index` counts, and why.
std::string choiceText(const VersionFiles& versions, std::size_t index);

} // namespace orvane::desk
