// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <filesystem>

namespace orvane::kit {

/// Makes a unit at `root`, which is absent or an empty folder, from what describeInputs finds at
/// `source`; with `redactsSerial`, the serial is replaced (redact_serial.h) before anything is
/// written, and stands nowhere in the new unit. Never writes below `source`, unless `root` lies
/// there. Throws KitError, also for a serial that can't be replaced; `root` is then as it was.
void captureUnit(const std::filesystem::path& source, const std::filesystem::path& root,
                 bool redactsSerial);

} // namespace orvane::kit
