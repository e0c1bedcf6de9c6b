// SPDX-License-Identifier: Apache-2.0
//
// An assignment to a unit's value, read and checked as far as it can be without the unit.
#pragma once

#include "kit/description/value_key.h"
#include "kit/host/bytes.h"

#include <string>
#include <vector>

namespace orvane::kit {

struct Assignment {
    std::string text; ///< as it was given
    ValueKey key;
    Bytes bytes; ///< as long as the place of `key`, zero in the bits of other values
};

/// Reads an assignment, and the tuning file that it may name. Throws KitError as setValues does.
Assignment readAssignment(const std::string& text);

/// Throws KitError when two of the assignments set the same value.
void requireDistinct(const std::vector<Assignment>& assignments);

} // namespace orvane::kit
