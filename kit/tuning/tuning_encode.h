// SPDX-License-Identifier: Apache-2.0
//
// From named tuning fields to the bytes of a tuning block and back.
#pragma once

#include "kit/tuning/tuning_description.h"
#include "tuning/dps_block.h"

#include <cstdint>
#include <string>

namespace orvane::kit {

/// Whether a tuning block has a field `key`.
bool isTuningField(const std::string& key);

/// The row of the field `key`. Throws KitError for an unknown key.
const DpsField& tuningField(const std::string& key);

/// Writes `value` to the field `key` of `block` and leaves all other bits unchanged. A switch or
/// mode takes one of its words or a code, a number field a number, a list field a number for each
/// element. Throws KitError for an unknown key or word, a number that the field can't hold, and a
/// value of the wrong shape; `block` is then unchanged.
void encodeTuningField(DpsBlock& block, const std::string& key, const TuningValue& value);

/// The whole block: the raw bytes, padded with zeros, then the fields. Throws as above, and for
/// more raw bytes than a block has.
DpsBlock encodeTuningBlock(const TuningDescription& description);

/// The inverse: all fields, as words where codes have them, and as raw bytes the bits that no field
/// reads, without the zeros at their end.
TuningDescription describeTuningBlock(const DpsBlock& block);

/// The numbers that an element of `field` can hold.
std::int64_t leastOf(const DpsField& field);
std::int64_t greatestOf(const DpsField& field);

/// The bits of the block that no field reads; all others are zero.
DpsBlock withoutFields(DpsBlock block);

} // namespace orvane::kit
