// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "orvane_unit/check/case_check.h"

#include <iosfwd>

namespace orvane::desk {

/// Prints each case with what is not as expected, but for its fault, then the number of cases and
/// the reasons that none of them reaches.
void printCheck(std::ostream& out, const CheckReport& report);

} // namespace orvane::desk
