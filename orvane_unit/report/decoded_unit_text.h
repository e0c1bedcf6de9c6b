// SPDX-License-Identifier: Apache-2.0
//
// A decoded unit for people.
#pragma once

#include "orvane_unit/show/decoded_unit.h"

#include <iosfwd>
#include <string>

namespace orvane::desk {

/// Prints the part `only`, or all of them when it is empty.
void printDecodedUnit(std::ostream& out, const DecodedUnit& unit, const std::string& only);

} // namespace orvane::desk
