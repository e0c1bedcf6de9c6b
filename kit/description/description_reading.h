// SPDX-License-Identifier: Apache-2.0
//
// The readers of a description's tables. Each stores values in a unit, notes their places, and
// throws KitError with the place of a value that it refuses.
#pragma once

#include "kit/description/toml_values.h"
#include "kit/description/unit_description.h"
#include "kit/description/value_key.h"
#include "kit/description/value_places.h"
#include "kit/host/sparse_content.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <filesystem>
#include <iterator>
#include <map>
#include <string>

namespace orvane::kit {

struct DescriptionReading {
    std::filesystem::path folder; ///< of the description: its host files are relative to it
    /// What repeated texts and host files may still give together, in bytes.
    std::uint64_t contentLeft = MOST_CONTENT;
    UnitDescription unit;
    std::map<ValueKey, Place> places; ///< of the keys that a conflict may name
};

/// A key that a table may have, and the reader of its value.
struct TableEntry {
    const char* key;
    void (*read)(const toml::key& key, const toml::node& value, DescriptionReading& reading);
};

/// Reads `table`, which may only have the keys of `entries`. `where` names it in an error.
template <std::size_t COUNT>
void readEntries(const toml::table& table, const char* where, const TableEntry (&entries)[COUNT],
                 DescriptionReading& reading) {
    for (const auto& [key, value] : table) {
        const auto* const entry =
            std::find_if(std::begin(entries), std::end(entries),
                         [&k = key](const TableEntry& row) { return k == row.key; });
        if (entry == std::end(entries)) {
            std::string known;
            for (const TableEntry& row : entries) {
                known += (known.empty() ? "" : ", ") + std::string(row.key);
            }
            failUnknown(key, where, known);
        }
        entry->read(key, value, reading);
    }
}

void readImage(const toml::key& key, const toml::node& node, DescriptionReading& reading);
void readDisk(const toml::key& key, const toml::node& node, DescriptionReading& reading);
void readFiles(const toml::key& key, const toml::node& node, DescriptionReading& reading);
void readLinks(const toml::key& key, const toml::node& node, DescriptionReading& reading);
void readFolders(const toml::key& key, const toml::node& node, DescriptionReading& reading);
void readAbsent(const toml::key& key, const toml::node& node, DescriptionReading& reading);

/// Reads a table of raw bytes, in hex by offset. `keyOf` gives the key of the bytes at an offset.
template <class Map, class KeyOf>
void readBytes(const toml::table& table, Map& bytes, const KeyOf& keyOf,
               DescriptionReading& reading) {
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
