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

/// Puts `value` into the field `key` of `block` and leaves all other bits alone. A switch or mode
/// takes one of its words or a code, a number field a number, a list field as many as it has
/// elements. Throws KitError for an unknown key or word, a number that the field can't hold, and a
/// value of the wrong shape; `block` is then unchanged.
void encodeTuningField(DpsBlock& block, const std::string& key, const TuningValue& value);

/// The whole block: the raw bytes, zeros behind them, then the fields. Throws as above, and for
/// more raw bytes than a block has.
DpsBlock encodeTuningBlock(const TuningDescription& description);

/// The block: all fields, a word where the code has one, and as raw bytes the bits that no field
/// reads, without the zeros at their end.
TuningDescription describeTuningBlock(const DpsBlock& block);

/// The numbers that an element of `field` can hold.
std::int64_t leastOf(const DpsField& field);
std::int64_t greatestOf(const DpsField& field);

/// The block with all bits that a field has set to zero: what no field reads.
DpsBlock withoutFields(DpsBlock block);

} // namespace orvane::kit
