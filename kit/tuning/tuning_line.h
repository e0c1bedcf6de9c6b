// SPDX-License-Identifier: Apache-2.0
//
// One line of a tuning file: a key, one blank, and a word or nothing, a number, or numbers with a
// blank behind each.
#pragma once

#include "tuning/dps_block.h"

#include <cstddef>
#include <string>
#include <string_view>

namespace orvane::kit {

/// What is wrong with a line, and where; empty where nothing is.
struct LineFault {
    std::size_t column = 0; ///< from 0
    std::string what;
};

/// Puts what `line`, which begins with the key of `field`, says into `block`. Leaves the block as
/// it was when there is a fault.
LineFault readTuningLine(std::string_view line, const DpsField& field, DpsBlock& block);

} // namespace orvane::kit
