// SPDX-License-Identifier: Apache-2.0
//
// Changing single values of a unit that is there.
#pragma once

#include <filesystem>
#include <string>
#include <vector>

namespace orvane::kit {

/// Does every assignment, "KEY=VALUE", to the unit at `root`, which must be one that the kit made:
///
///     param.N         a parameter of the image: a number
///     serial, slot.N  a record slot of the disk, padded with zeros: a text, or hex after "hex:"
///     aux             the auxiliary area, padded with zeros: the same
///     tuning.B.FIELD  a field of tuning block B: a word, a number, or numbers with commas or
///     blanks tuning.B        all fields of the block: a tuning file of the host, as the tool
///     writes it
///
/// Numbers are decimal or, with 0x, hexadecimal. What no field of a block reads stays as it is. All
/// assignments are checked before the first one is done. Throws KitError, the assignment in front,
/// for a key or value that is wrong, a value that two assignments set, and an image or disk that is
/// missing, not a regular file or too short; for a tuning file the lines of parseTuningText.
void setValues(const std::filesystem::path& root, const std::vector<std::string>& assignments);

} // namespace orvane::kit
