// SPDX-License-Identifier: Apache-2.0
//
// The readers of a description's tables. Each enters what it finds into a unit, notes its place,
// and throws KitError with the place for what it refuses.
#pragma once

#include "kit/description/toml_values.h"
#include "kit/description/unit_description.h"

#include <filesystem>
#include <map>
#include <string>

namespace orvane::kit {

struct DescriptionReading {
    std::filesystem::path folder; ///< of the description: its host files are relative to it
    UnitDescription unit;
    std::map<std::string, Place> places; ///< of the parts that unit_misfit.h names
};

void readImage(const toml::table& table, DescriptionReading& reading);
void readDisk(const toml::table& table, DescriptionReading& reading);
void readFiles(const toml::table& table, DescriptionReading& reading);
void readLinks(const toml::table& table, DescriptionReading& reading);

/// The paths of the list under `key`.
std::vector<std::string> readPaths(const toml::key& key, const toml::node& node,
                                   DescriptionReading& reading);

/// A table of raw bytes in hex by offset. `partName` names a part by its offset.
template <class Map, class PartName>
void readBytes(const toml::table& table, Map& bytes, DescriptionReading& reading,
               const PartName& partName) {
    constexpr std::uint64_t GREATEST =
        sizeof(typename Map::key_type) == 4 ? 0xFFFFFFFFU : 0x7FFFFFFFFFFFFFFFU;
    for (const auto& [key, value] : table) {
        const std::uint64_t offset = numberOf(key, {0, GREATEST}, "an offset");
        const std::string what = "what stands at " + std::to_string(offset);
        putOnce(bytes, key, offset, hexOf(value, what), what);
        reading.places[partName(offset)] = key.source();
    }
}

} // namespace orvane::kit
