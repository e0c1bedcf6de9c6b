// SPDX-License-Identifier: Apache-2.0
//
// What the tool may leave when it runs short of something: whole files only, made of true values
// and of defaults.
#pragma once

#include <set>
#include <string>

namespace orvane::test {

constexpr char LONG_MODEL[] = "Marl Kolvenda Cargo"; // code 41: needs memory of its own
constexpr char LONG_VERSION[] = "3.10.2.a-version-that-needs-memory-of-its-own";

/// Fills the entered unit with everything that a whole run of "-a -i" needs.
void fillWholeUnit();

/// The texts of one output that are acceptable, by its name in /tmp.
std::set<std::string> acceptedTexts(const std::string& name);

/// The names of all outputs, in the order in which they are written.
extern const char* const OUTPUT_NAMES[6];

} // namespace orvane::test
