// SPDX-License-Identifier: Apache-2.0
//
// What changes which output lines, as text.
#pragma once

#include "orvane_unit/compare/impact.h"
#include "orvane_unit/compare/output_differences.h"

#include <cstddef>
#include <iosfwd>
#include <vector>

namespace orvane::desk {

/// Prints each changed value, and below it the output lines that differ because of it.
void printConsequences(std::ostream& out, const std::vector<Consequence>& consequences);

/// Prints each input that changes lines with those lines, then all that change nothing.
void printImpacts(std::ostream& out, const std::vector<Impact>& impacts);

/// Draws a bar over the previous one, and erases it at the end.
void printProgress(std::ostream& terminal, std::size_t done, std::size_t all);

} // namespace orvane::desk
