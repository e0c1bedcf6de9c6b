// SPDX-License-Identifier: Apache-2.0
//
// Tuning files: one header line and 44 lines of key and value for the acoustic-processing
// component.
#pragma once

#include "tuning/dps_block.h"

#include <cstdint>
#include <iosfwd>
#include <string>

namespace orvane {

/// Whether there is a tuning block with this id.
bool isTuningBlock(std::int32_t blockId);

/// All blocks of the disk; zeros where it can't be read.
DpsArea readTuningBlocks();

/// Writes the line of one field of `block`, and flushes it.
void writeTuningLine(std::ostream& file, const DpsField& field, const DpsBlock& block);

/// Writes the text of one block to `file`: the header with the block's id, then a line for each
/// field in the order of DPS_LAYOUT. Every line is flushed.
void writeTuningText(std::ostream& file, std::int32_t blockId, const DpsBlock& block);

/// Writes tuning block `blockId` (0 to 9) of the disk to the file at `path`, created with mode 0666
/// less the umask, or truncated. Reads the disk first; what can't be read is rendered as zeros.
/// When the file can't be opened, or for any other block id, nothing is written and an older file
/// stays. Reports nothing.
void generateTuningFile(std::int32_t blockId, const std::string& path);

} // namespace orvane
