// SPDX-License-Identifier: Apache-2.0
//
// Changing single values of an existing unit.
#pragma once

#include <filesystem>
#include <string>
#include <vector>

namespace orvane::kit {

/// Carries out every assignment, "KEY=VALUE", on the unit at `root`, which must be one that the kit
/// made. The keys and their values:
///
///  - `param.N`: a parameter of the image; a number
///  - `serial`, `slot.N`: a record slot of the disk; a text, or hex after "hex:", which is padded
///    with zeros
///  - `aux`: the auxiliary area; the same
///  - `tuning.B.FIELD`: a field of tuning block B; a word, a number, or numbers with commas or
///    blanks between them
///  - `tuning.B`: all fields of the block; the name of a tuning file of the host, as the tool
///    writes it
///
/// Numbers are decimal or, after "0x", hexadecimal. The bits of a block that no field reads stay as
/// they are. All assignments are checked, and have the room that they need, before the first one is
/// carried out; the unit is locked meanwhile. Throws KitError, the assignment in front, for a wrong
/// key or value, a value that two assignments set, an image or disk that is missing, not a regular
/// file or too short, and a full disk; for a faulty tuning file like parseTuningText. An assignment
/// that can't be written all the same is named together with those that have been carried out.
void setValues(const std::filesystem::path& root, const std::vector<std::string>& assignments);

} // namespace orvane::kit
