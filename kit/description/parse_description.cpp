// SPDX-License-Identifier: Apache-2.0
#include "kit/description/parse_description.h"

#include "kit/description/conflicts.h"
#include "kit/description/description_reading.h"
#include "kit/description/toml_keys.h"
#include "kit/description/toml_library.h"
#include "kit/description/toml_values.h"
#include "kit/description/unit_description.h"
#include "kit/description/unit_layout.h"
#include "kit/description/value_key.h"
#include "kit/host/kit_error.h"
#include "kit/host/whole_file.h"

#include <filesystem>
#include <map>
#include <optional>
#include <string>
#include <system_error>
#include <utility>

namespace orvane::kit {

namespace {

constexpr TableEntry UNIT_ENTRIES[] = {
    {"folders", readFolders}, {"absent", readAbsent}, {"image", readImage},
    {"disk", readDisk},       {"files", readFiles},   {"links", readLinks},
};

void failIfAny(const std::optional<Conflict>& conflict, const DescriptionReading& reading) {
    if (conflict) {
        failAt(reading.places.at(conflict->key), conflict->what);
    }
}

} // namespace

UnitDescription parseDescription(const std::string& text, const std::string& name) {
    requireShortKeys(text, name);
    toml::table table;
    try {
        table = toml::parse(text, name);
    } catch (const toml::parse_error& error) {
        failAt(error.source(), std::string(error.description()));
    }
    DescriptionReading reading;
    reading.folder = std::filesystem::path(name).parent_path();
    readEntries(table, "a unit", UNIT_ENTRIES, reading);
    failIfAny(findPathConflict(reading.unit), reading);
    failIfAny(findSizeConflict(reading.unit, layoutOf(reading.unit)), reading);
    return std::move(reading.unit);
}

UnitDescription readDescription(const std::filesystem::path& file) {
    std::error_code error;
    if (std::filesystem::is_directory(file, error)) {
        throw KitError("", file, " is a folder, not a description");
    }
    return parseDescription(readWholeFile(file, LONGEST_DESCRIPTION), file.string());
}

} // namespace orvane::kit
