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

    bool operator==(const TuningDescription& other) const {
        return raw == other.raw && fields == other.fields;
    }
};

/// The published configuration image.
struct ImageDescription {
    std::uint32_t size = CONFIG_IMAGE_SIZE;        ///< bytes; values beyond it are an error
    std::map<std::uint16_t, std::uint16_t> params; ///< by parameter number
    std::map<std::uint32_t, Bytes> bytes; ///< raw bytes by offset, put after the parameters

    bool operator==(const ImageDescription& other) const {
        return size == other.size && params == other.params && bytes == other.bytes;
    }
};

/// The boot disk: zeros but for what is named here.
struct DiskDescription {
    std::uint64_t size = std::uint64_t{2} << 20U;      ///< bytes
    std::map<std::uint32_t, Bytes> slots;              ///< by slot number, through writeRecordSlot
    std::optional<Bytes> aux;                          ///< through writeAuxArea
    std::map<std::uint32_t, TuningDescription> tuning; ///< by block id, through writeTuningArea
    std::map<std::uint64_t, Bytes> bytes; ///< raw bytes by offset from the start of the disk

    bool operator==(const DiskDescription& other) const {
        return size == other.size && slots == other.slots && aux == other.aux &&
               tuning == other.tuning && bytes == other.bytes;
    }
};

/// A file of zeros but for what is named here; the zeros take no room on the host.
struct SparseFile {
    std::uint64_t size = 0;               ///< bytes
    std::map<std::uint64_t, Bytes> bytes; ///< by offset; they lie within the size

    bool operator==(const SparseFile& other) const {
        return size == other.size && bytes == other.bytes;
    }
};

/// A whole unit, by absolute paths on it. No path is named twice but in `absent`, and nothing lies
/// below a file or a link.
struct UnitDescription {
    ImageDescription image;
    DiskDescription disk;
    std::map<std::string, Bytes> files;            ///< path -> content
    std::map<std::string, SparseFile> sparseFiles; ///< path -> content
    std::map<std::string, std::string> links;      ///< path -> target of a symbolic link
    std::vector<std::string> folders;              ///< further folders
    std::vector<std::string> absent; ///< paths at and below which nothing is made after all

    bool operator==(const UnitDescription& other) const {
        return image == other.image && disk == other.disk && files == other.files &&
               sparseFiles == other.sparseFiles && links == other.links &&
               folders == other.folders && absent == other.absent;
    }
};

/// Reads a description. `name` is that of its file: it stands in the error texts, and the host
/// files that the text names are relative to its folder. Throws KitError with "name:line:column:"
/// in front for anything that is not a description: bad TOML, an unknown key, a value that does not
/// fit.
UnitDescription parseDescription(const std::string& text, const std::string& name);
UnitDescription readDescription(const std::filesystem::path& file);

/// The built-in sample unit.
const char* sampleDescriptionText();

/// Makes the unit at `root`, which must be absent or an empty folder. Image and files are written
/// through the host's file system, disk records with the product's own operations inside the unit.
/// All of it happens in a folder beside `root` whose name begins with "." and root's name, and
/// which takes the place of `root` when it is whole. Throws KitError; `root` is then as it was
/// before. What ends the process half-way leaves the folder beside, and `root` as it was.
void makeUnit(const UnitDescription& unit, const std::filesystem::path& root);

} // namespace orvane::kit
