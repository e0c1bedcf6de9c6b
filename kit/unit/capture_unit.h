// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <filesystem>

namespace orvane::kit {

/// Makes a unit at `root`, absent or an empty folder, of what describeInputs finds at `source`,
/// with the unit's serial made unreadable (redact_serial.h) where `redactsSerial`. Never writes
/// below `source`, unless `root` lies there. Throws KitError; `root` is then as it was.
void captureUnit(const std::filesystem::path& source, const std::filesystem::path& root,
                 bool redactsSerial);

} // namespace orvane::kit
