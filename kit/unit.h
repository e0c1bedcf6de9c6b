// SPDX-License-Identifier: Apache-2.0
//
// The description of a simulated unit and the making of one. A description is a TOML file; its keys
// are listed in docs/unit-description.md.
#pragma once

#include "config/param_catalogue.h"

#include <cstdint>
#include <filesystem>
#include <map>
#include <optional>
#include <string>
#include <variant>
#include <vector>

namespace orvane::kit {

using Bytes = std::string; ///< raw bytes, not text

/// A value of one tuning field: a word ("qwaOn"), a number or a list of numbers.
using TuningValue = std::variant<std::string, std::int64_t, std::vector<std::int64_t>>;

/// One tuning block: raw bytes first (zeros where none are given), then the named fields over them.
struct TuningDescription {
    Bytes raw;                                 ///< at most 188 bytes
    std::map<std::string, TuningValue> fields; ///< by key, as in a tuning file
};

/// The published configuration image.
struct ImageDescription {
    std::uint32_t size = CONFIG_IMAGE_SIZE;        ///< bytes; values beyond it are an error
    std::map<std::uint16_t, std::uint16_t> params; ///< by parameter number
    std::map<std::uint32_t, Bytes> bytes; ///< raw bytes by offset, put after the parameters
};

/// The boot disk: zeros but for what is named here.
struct DiskDescription {
    std::uint64_t size = std::uint64_t{2} << 20U;      ///< bytes
    std::map<std::uint32_t, Bytes> slots;              ///< by slot number, through writeRecordSlot
    std::optional<Bytes> aux;                          ///< through writeAuxArea
    std::map<std::uint32_t, TuningDescription> tuning; ///< by block id, through writeTuningArea
    std::map<std::uint64_t, Bytes> bytes; ///< raw bytes by offset from the start of the disk
};

/// A whole unit. Files are made in the order of their paths.
struct UnitDescription {
    ImageDescription image;
    DiskDescription disk;
    std::map<std::string, Bytes> files; ///< absolute path on the unit -> content
    std::vector<std::string> folders;   ///< further folders
    std::vector<std::string> absent;    ///< paths removed at the end, with all below them
};

/// Reads a description. `name` stands in the error texts. Throws KitError with "name:line:column:"
/// in front for anything that is not a description: bad TOML, an unknown key, a value that does not
/// fit.
UnitDescription parseDescription(const std::string& text, const std::string& name);
UnitDescription readDescription(const std::filesystem::path& file);

/// The built-in sample unit.
const char* sampleDescriptionText();

/// Makes the unit below `root`, which must be absent or an empty folder. Image and files are
/// written through the host's file system, disk records with the product's own operations inside
/// the root. Throws KitError; then nothing is left at `root` that was not there before.
void makeUnit(const UnitDescription& unit, const std::filesystem::path& root);

} // namespace orvane::kit
