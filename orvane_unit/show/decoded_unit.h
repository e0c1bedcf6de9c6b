// SPDX-License-Identifier: Apache-2.0
//
// Everything that a unit holds, read with the tool's own operations and decoded.
#pragma once

#include "config/param_catalogue.h"
#include "kit/host/sparse_content.h"
#include "orvane_unit/explain/explanation.h"
#include "orvane_unit/explain/reasons.h"
#include "orvane_unit/explain/value_origins.h"
#include "orvane_unit/explain/version_choice.h"

#include <cstdint>
#include <filesystem>
#include <map>
#include <optional>
#include <string>
#include <vector>

namespace orvane::desk {

struct DecodedParam {
    ParamDescriptor row{};
    std::uint32_t code = 0;           ///< the upper half of the row's id
    std::uint32_t size = 0;           ///< bytes
    std::optional<std::uint16_t> raw; ///< none without an image, or past its end
    std::string meaning; ///< what the tool makes of it; empty where it does not read it
};

struct DecodedImage {
    Image found;
    std::vector<DecodedParam> params; ///< all of the catalogue
};

struct DecodedSlot {
    std::uint32_t number = 0;
    std::uint32_t size = 0;   ///< bytes
    std::uint64_t offset = 0; ///< from the record area's base
    std::optional<std::string> bytes;
};

/// What is known of the CRC. The disk stores none to compare it with.
enum class CrcVerdict {
    computed,
    blank,      ///< the records are all zero
    ambiguous,  ///< all ones, which is also the value of a failure
    unreadable, ///< the disk can't be read
};

struct DecodedRecords {
    std::uint64_t diskSize = 0;        ///< bytes
    std::optional<Reason> diskTrouble; ///< why the record area can't be read
    std::vector<DecodedSlot> slots;    ///< all of them
    std::optional<std::string> aux;
    kit::SparseContent rest; ///< by offset as of a slot, what belongs to nothing and is not zero
    std::uint32_t crc = 0;
    CrcVerdict crcVerdict = CrcVerdict::unreadable;
};

struct DecodedVersions {
    VersionFiles found;
    std::string version; ///< as the two iAP2 files carry it
    std::string digits;  ///< as the iAP1 file carries it
};

/// What the unit and its vehicle are called, as the tool reads them.
struct DecodedIdentity {
    std::string model;
    std::string brand;
    std::string fuelType;
    std::string serial;
    unsigned rightHandDrive = 0;
    std::int32_t audioProfile = 0; ///< as of readAudioProfile
};

/// A path that a run opens, and what is there.
struct UnitFile {
    std::string path;
    std::string role; ///< "template", "stock file", "output", ...
    PathKind kind = PathKind::nothing;
    std::uint64_t size = 0; ///< bytes, of a file
};

struct DecodedUnit {
    DecodedIdentity identity;
    DecodedImage image;
    DecodedRecords records;
    TuningArea tuning;
    DecodedVersions versions;
    std::vector<UnitFile> files;
};

/// Calls `visit(name, part)` for each part that can be reported alone. All reports use this list.
template <class Visit>
void forEachPart(const DecodedUnit& unit, Visit visit) {
    visit("params", unit.image);
    visit("records", unit.records);
    visit("tuning", unit.tuning);
    visit("versions", unit.versions);
    visit("files", unit.files);
}

/// The names of the parts, in the order in which they are reported.
std::vector<std::string> partNames();

/// Reads the unit at `root`, "/" for the system itself. Throws kit::KitError when it can't be
/// entered.
DecodedUnit decodeUnit(const std::filesystem::path& root);

} // namespace orvane::desk
