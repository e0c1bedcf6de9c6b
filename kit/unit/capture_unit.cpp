// SPDX-License-Identifier: Apache-2.0
#include "kit/unit/capture_unit.h"

#include "kit/host/bytes.h"
#include "kit/unit/describe_inputs.h"
#include "kit/unit/make_unit.h"
#include "kit/unit/redact_serial.h"

#include <utility>

namespace orvane::kit {

void captureUnit(const std::filesystem::path& source, const std::filesystem::path& root,
                 bool redactsSerial) {
    UnitInputs inputs = readInputs(source);
    const Bytes serial = redactsSerial ? redactSerial(inputs) : Bytes();
    makeUnit(descriptionOf(std::move(inputs)), root, [&serial](const std::filesystem::path& made) {
        if (!serial.empty()) {
            requireNowhere(serial, made);
        }
    });
}

} // namespace orvane::kit
