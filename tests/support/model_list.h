// SPDX-License-Identifier: Apache-2.0
//
// The display names of the models as a list of their own, which the model in Python reads as well:
// what a test expects must not come from the product's table.
#pragma once

#include <string>

namespace orvane::test {

/// The name of model code 1 to 47. Was read before any test entered a unit.
std::string listedModel(int code);

} // namespace orvane::test
