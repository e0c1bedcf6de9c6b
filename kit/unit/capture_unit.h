// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <filesystem>

namespace orvane::kit {

/// Makes a unit at `root`, which is absent or an empty folder, from what describeInputs finds at
/// `source`; with `redactsSerial`, the serial is made unreadable (redact_serial.h). Never writes
/// below `source`, unless `root` lies there. Throws KitError; `root` is then as it was.
void captureUnit(const std::filesystem::path& source, const std::filesystem::path& root,
                 bool redactsSerial);

} // namespace orvane::kit
