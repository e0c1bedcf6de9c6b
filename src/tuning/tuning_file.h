// SPDX-License-Identifier: Apache-2.0
//
// Tuning files: one header line and 44 lines of key and value for the acoustic-processing
// component.
#pragma once

#include <cstdint>
#include <string>

namespace orvane {

/// Writes tuning block `blockId` (0 to 9) of the disk to the file at `path`, created with mode 0666
/// less the umask, or truncated. Reads the disk first; what can't be read is rendered as zeros.
/// When the file can't be opened, or for any other block id, nothing is written and an older file
/// stays. Reports nothing.
void generateTuningFile(std::int32_t blockId, const std::string& path);

} // namespace orvane
