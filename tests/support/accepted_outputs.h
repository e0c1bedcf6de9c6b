// SPDX-License-Identifier: Apache-2.0
//
// What the tool may leave when a resource runs out: only whole files, made of true values and
// defaults.
#pragma once

#include <set>
#include <string>

namespace orvane::test {

constexpr char LONG_MODEL[] = "Marl Kolvenda Cargo"; // code 41: too long for a string's own buffer
constexpr char LONG_VERSION[] = "3.10.2.a-version-that-needs-memory-of-its-own";

/// Fills the entered unit with everything that a whole run of "-a -i" needs.
void fillWholeUnit();

/// The acceptable texts of the output with this name in /tmp.
std::set<std::string> acceptedTexts(const std::string& name);

/// The names of all outputs, in the order in which they are written.
extern const char* const OUTPUT_NAMES[6];

} // namespace orvane::test
