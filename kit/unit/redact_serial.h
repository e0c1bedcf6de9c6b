// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "kit/unit/describe_inputs.h"

namespace orvane::kit {

/// Replaces the serial in record slot 9 by as many "X", and what follows it in the slot by zeros. A
/// serial of at least four bytes is replaced wherever else it occurs on the disk or in a file, too.
/// Does nothing if the disk is too short for the slot.
void redactSerial(UnitInputs& inputs);

} // namespace orvane::kit
