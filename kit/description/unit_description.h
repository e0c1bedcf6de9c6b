// SPDX-License-Identifier: Apache-2.0
//
// The description of a simulated unit.
#pragma once

#include "config/param_catalogue.h"
#include "kit/host/bytes.h"
#include "kit/tuning/tuning_description.h"

#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <vector>

namespace orvane::kit {

/// The published configuration image.
struct ImageDescription {
    std::uint32_t size = CONFIG_IMAGE_SIZE;        ///< bytes; values beyond it are an error
    std::map<std::uint16_t, std::uint16_t> params; ///< by parameter number
    std::map<std::uint32_t, Bytes> bytes; ///< raw bytes by offset, put after the parameters
};

/// The boot disk: zeros except for what is named here.
struct DiskDescription {
    std::uint64_t size = std::uint64_t{2} << 20U;      ///< bytes
    std::map<std::uint32_t, Bytes> slots;              ///< by slot number, through writeRecordSlot
    std::optional<Bytes> aux;                          ///< through writeAuxArea
    std::map<std::uint32_t, TuningDescription> tuning; ///< by block id, through writeTuningArea
    std::map<std::uint64_t, Bytes> bytes; ///< raw bytes by offset from the start of the disk
};

/// A file of zeros except for what is named here; the zeros take no room on the host.
struct SparseFile {
    std::uint64_t size = 0;               ///< bytes
    std::map<std::uint64_t, Bytes> bytes; ///< by offset; they lie within the size
};

/// A whole unit, by its absolute paths. No path is named twice except in `absent`, and nothing lies
/// below a file or a link.
struct UnitDescription {
    ImageDescription image;
    DiskDescription disk;
    std::map<std::string, Bytes> files;            ///< path -> content
    std::map<std::string, SparseFile> sparseFiles; ///< path -> content
    std::map<std::string, std::string> links;      ///< path -> target of a symbolic link
    std::vector<std::string> folders;              ///< further folders
    std::vector<std::string> absent;               ///< paths at and below which nothing is made
};

} // namespace orvane::kit
