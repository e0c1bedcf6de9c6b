// SPDX-License-Identifier: Apache-2.0
#include "kit/unit/capture_unit.h"

#include "kit/unit/describe_inputs.h"
#include "kit/unit/make_unit.h"
#include "kit/unit/redact_serial.h"

#include <utility>

namespace orvane::kit {

void captureUnit(const std::filesystem::path& source, const std::filesystem::path& root,
                 bool redactsSerial) {
    UnitInputs inputs = readInputs(source);
    if (redactsSerial) {
        redactSerial(inputs);
    }
    makeUnit(descriptionOf(std::move(inputs)), root);
}

} // namespace orvane::kit
