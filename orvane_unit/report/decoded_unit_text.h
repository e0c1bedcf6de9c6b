// SPDX-License-Identifier: Apache-2.0
//
// The contents of a unit for people.
#pragma once

#include "orvane_unit/show/decoded_unit.h"

#include <iosfwd>
#include <string>

namespace orvane::desk {

/// The parts that can be asked for alone.
constexpr const char* CONTENT_PARTS[] = {"params", "records", "tuning", "versions", "files"};

/// Prints the part `only`, or all of them when it is empty.
void printContents(std::ostream& out, const Contents& contents, const std::string& only);

} // namespace orvane::desk
