// SPDX-License-Identifier: Apache-2.0
//
// What moves what, for people.
#pragma once

#include "orvane_unit/compare/impact.h"
#include "orvane_unit/compare/output_differences.h"

#include <cstddef>
#include <iosfwd>
#include <vector>

namespace orvane::desk {

/// Prints each changed value, and below it the output lines that differ because of it.
void printConsequences(std::ostream& out, const std::vector<Consequence>& consequences);

/// Prints each input that moves a line with the lines it moves, then all that move nothing.
void printImpacts(std::ostream& out, const std::vector<Impact>& impacts);

/// Draws a bar over the one drawn before, and erases it at the end.
void printProgress(std::ostream& terminal, std::size_t done, std::size_t all);

} // namespace orvane::desk
