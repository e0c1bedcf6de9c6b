// SPDX-License-Identifier: Apache-2.0
//
// Descriptions are equal when all their parts are. Only tests compare them.
#pragma once

#include "kit/description/unit_description.h"
#include "kit/tuning/tuning_description.h"

#include <tuple>

namespace orvane::kit {

inline bool operator==(const TuningDescription& one, const TuningDescription& other) {
    return std::tie(one.raw, one.fields) == std::tie(other.raw, other.fields);
}

inline bool operator==(const ImageDescription& one, const ImageDescription& other) {
    return std::tie(one.size, one.params, one.bytes) ==
           std::tie(other.size, other.params, other.bytes);
}

inline bool operator==(const DiskDescription& one, const DiskDescription& other) {
    return std::tie(one.size, one.slots, one.aux, one.tuning, one.bytes) ==
           std::tie(other.size, other.slots, other.aux, other.tuning, other.bytes);
}

inline bool operator==(const SparseFile& one, const SparseFile& other) {
    return std::tie(one.size, one.bytes) == std::tie(other.size, other.bytes);
}

inline bool operator==(const UnitDescription& one, const UnitDescription& other) {
    return std::tie(one.image, one.disk, one.files, one.sparseFiles, one.links, one.folders,
                    one.absent) == std::tie(other.image, other.disk, other.files, other.sparseFiles,
                                            other.links, other.folders, other.absent);
}

} // namespace orvane::kit
