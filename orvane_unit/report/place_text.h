// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "kit/description/value_key.h"
#include "orvane_unit/explain/explanation.h"

#include <string>

namespace orvane::desk {

/// What holds the value of `key`: "parameter 139", "record slot 9", "block 3"; empty for others.
std::string holderText(const kit::ValueKey& key);

/// Where a value lies, with its raw bytes, or what was found there instead; empty for the tool's
/// own text. Bytes of the unit are not escaped.
std::string placeText(const Origin& origin);

/// Whether two values have the same place and reasons, as those of a block of zeros.
bool saysTheSame(const Origin& one, const Origin& other);

} // namespace orvane::desk
