// SPDX-License-Identifier: Apache-2.0
//
// Everything that a unit holds, read with the tool's own operations and decoded.
#pragma once

#include "config/param_catalogue.h"
#include "orvane_unit/explain/explanation.h"
#include "orvane_unit/explain/reasons.h"
#include "orvane_unit/explain/value_origins.h"
#include "orvane_unit/explain/version_choice.h"

#include <cstdint>
#include <filesystem>
#include <optional>
#include <string>
#include <vector>

namespace orvane::desk {

struct Param {
    ParamDescriptor row{};
    std::uint32_t size = 0;           ///< bytes
    std::optional<std::uint16_t> raw; ///< none without an image, or past its end
    std::string meaning; ///< what the tool makes of it; empty where it does not read it
};

struct Slot {
    std::uint32_t number = 0;
    std::uint32_t size = 0;   ///< bytes
    std::uint64_t offset = 0; ///< from the record area's base
    std::optional<std::string> bytes;
};

/// What can be said of the CRC over slots 1 to 9; no place of the disk holds one to compare with.
enum class CrcVerdict {
    computed,
    blank,      ///< the records are all zero
    ambiguous,  ///< all ones, which is the value of a failure, too
    unreadable, ///< the disk can't be read
};

const char* crcVerdictName(CrcVerdict verdict);

/// A path that a run opens, and what is there.
struct UnitFile {
    std::string path;
    std::string role; ///< "template", "stock", "output", ...
    PathKind kind = PathKind::nothing;
    std::uint64_t size = 0; ///< bytes, of a file
};

struct Contents {
    Image image;
    std::vector<Param> params; ///< all of the catalogue
    std::uint64_t diskSize = 0;
    std::optional<Reason> diskTrouble; ///< why the record area can't be read
    std::vector<Slot> slots;           ///< all of them
    std::optional<std::string> aux;
    std::uint32_t crc = 0;
    CrcVerdict crcVerdict = CrcVerdict::unreadable;
    TuningArea tuning;
    VersionFiles versions;
    std::string version; ///< as the two iAP2 files carry it
    std::string versionDigits;
    std::vector<UnitFile> files;
};

/// Reads the unit at `root`, "/" for the system itself. Throws kit::KitError when it can't be
/// entered.
Contents readContents(const std::filesystem::path& root);

} // namespace orvane::desk
