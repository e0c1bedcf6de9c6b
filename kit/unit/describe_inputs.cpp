// SPDX-License-Identifier: Apache-2.0
#include "kit/unit/describe_inputs.h"

#include "kit/unit/unit_inputs.h"

namespace orvane::kit {

UnitDescription inspectInputs(const std::filesystem::path& source) {
    return describeInputs(readInputs(source));
}

} // namespace orvane::kit
