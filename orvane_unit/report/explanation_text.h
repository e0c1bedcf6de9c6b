// SPDX-License-Identifier: Apache-2.0
//
// An explanation for people.
#pragma once

#include "orvane_unit/explain/explanation.h"

#include <iosfwd>

namespace orvane::desk {

/// Prints each output with its outcome and reasons, and below it its lines with their origins. The
/// tool's own text is left out unless `showsAll`.
void printExplanation(std::ostream& out, const Explanation& explanation, bool showsAll);

} // namespace orvane::desk
