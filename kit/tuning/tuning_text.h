// SPDX-License-Identifier: Apache-2.0
//
// From the text of a tuning file to the bytes of a block: the inverse of writeTuningText.
#pragma once

#include "tuning/dps_block.h"

#include <cstdint>
#include <string>

namespace orvane::kit {

/// The block that the tuning file `text` shows; what no field reads is zero, and so is a code that
/// has no word, since the file shows nothing for it. `blockId` is the block that it is for; the
/// file may be that of any block. Accepts exactly what writeTuningText writes. Throws KitError for
/// the first byte that differs, "name:line:column:" in front.
DpsBlock parseTuningText(const std::string& text, const std::string& name, std::int32_t blockId);

} // namespace orvane::kit
