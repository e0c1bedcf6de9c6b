// SPDX-License-Identifier: Apache-2.0
//
// The options in a command line of the tool, as the product's own parser reads them.
#pragma once

#include "main/options.h"

#include <cstddef>
#include <string>
#include <vector>

namespace orvane::desk {

/// The writers that a command line asks for, in their order.
std::vector<Writer> writersOf(const std::vector<std::string>& arguments);

/// How many of its options the tool does not know: of each, the C library prints a line on standard
/// error.
std::size_t countUnknownOptions(const std::vector<std::string>& arguments);

} // namespace orvane::desk
