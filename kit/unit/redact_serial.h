// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "kit/unit/describe_inputs.h"

namespace orvane::kit {

/// Makes the serial text in record slot 9 as many "X", and zero what stands in the slot behind its
/// first zero byte. A serial of at least four bytes becomes "X" wherever else it stands on the disk
/// or in a file. Does nothing where the disk is too short for the slot.
void redactSerial(UnitInputs& inputs);

} // namespace orvane::kit
