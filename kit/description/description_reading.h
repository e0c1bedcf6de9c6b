// SPDX-License-Identifier: Apache-2.0
//
// The readers of a description's tables. Each enters what it finds into a unit, notes its place,
// and throws KitError with the place for what it refuses.
#pragma once

#include "kit/description/toml_values.h"
#include "kit/description/unit_description.h"
#include "kit/description/value_key.h"
#include "kit/description/value_places.h"

#include <filesystem>
#include <map>
#include <string>

namespace orvane::kit {

struct DescriptionReading {
    std::filesystem::path folder; ///< of the description: its host files are relative to it
    UnitDescription unit;
    std::map<ValueKey, Place> places; ///< of the keys that a conflict may name
};

void readImage(const toml::table& table, DescriptionReading& reading);
void readDisk(const toml::table& table, DescriptionReading& reading);
void readFiles(const toml::table& table, DescriptionReading& reading);
void readLinks(const toml::table& table, DescriptionReading& reading);

/// The paths of the list under `key`. `keyOf` gives the key of the value that is at a path.
std::vector<std::string> readPaths(const toml::key& key, const toml::node& node,
                                   ValueKey (*keyOf)(std::string), DescriptionReading& reading);

/// A table of raw bytes in hex by offset. `keyOf` gives the key of those at an offset.
template <class Map, class KeyOf>
void readBytes(const toml::table& table, Map& bytes, DescriptionReading& reading,
               const KeyOf& keyOf) {
    constexpr std::uint64_t GREATEST =
        sizeof(typename Map::key_type) == 4 ? 0xFFFFFFFFU : 0x7FFFFFFFFFFFFFFFU;
    for (const auto& [key, value] : table) {
        const std::uint64_t offset = numberOf(key, {0, GREATEST}, "an offset");
        const ValueKey bytesKey = keyOf(offset);
        const std::string what = valueName(bytesKey);
        putOnce(bytes, key, offset, hexOf(value, what), what);
        reading.places[bytesKey] = key.source();
    }
}

} // namespace orvane::kit
