// SPDX-License-Identifier: Apache-2.0
//
// From named tuning fields to the bytes of a tuning block: the way back of decodeField.
#pragma once

#include "kit/unit.h"
#include "tuning/dps_block.h"

namespace orvane::kit {

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

} // namespace orvane::kit
