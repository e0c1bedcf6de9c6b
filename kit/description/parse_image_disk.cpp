// SPDX-License-Identifier: Apache-2.0
#include "config/param_catalogue.h"
#include "config/record_slots.h"
#include "kit/description/description_reading.h"
#include "kit/description/description_values.h"
#include "kit/description/toml_library.h"
#include "kit/description/toml_values.h"
#include "kit/description/unit_checks.h"
#include "kit/description/unit_description.h"
#include "kit/description/value_key.h"
#include "kit/description/value_places.h"
#include "kit/host/bytes.h"
#include "kit/host/kit_error.h"
#include "kit/tuning/tuning_description.h"
#include "kit/tuning/tuning_encode.h"
#include "tuning/dps_block.h"

#include <array>
#include <cstdint>
#include <limits>
#include <map>
#include <optional>
#include <string>
#include <type_traits>
#include <vector>

namespace orvane::kit {

namespace {

void readParams(const toml::key& tableKey, const toml::node& node, DescriptionReading& reading) {
    for (const auto& [key, value] : tableOf(tableKey, node)) {
        const auto number =
            static_cast<std::uint16_t>(numberOf(key, {1, PARAM_COUNT}, "a parameter number"));
        const ValueKey param = paramKey(number);
        const std::string what = valueName(param);
        const std::int64_t content = numberOf(value, what);
        at(value.source(), [&] { checkParam(number, content); });
        putOnce(reading.unit.image.params, key, number, static_cast<std::uint16_t>(content), what);
        reading.places[param] = key.source();
    }
}

void readSlots(const toml::key& tableKey, const toml::node& node, DescriptionReading& reading) {
    for (const auto& [key, value] : tableOf(tableKey, node)) {
        const auto slot =
            static_cast<std::uint32_t>(numberOf(key, {0, RECORD_SLOT_COUNT - 1}, "a slot number"));
        const std::string what = valueName(slotKey(slot));
        const std::string& text = textOf(value, what);
        const Bytes bytes = at(value.source(), what, [&text] { return textOrHexBytes(text); });
        at(value.source(), [&] { checkSlot(slot, bytes); });
        putOnce(reading.unit.disk.slots, key, slot, bytes, what);
        reading.places[slotKey(slot)] = key.source();
    }
}

void readAux(const toml::key& key, const toml::node& value, DescriptionReading& reading) {
    const std::string& text = textOf(value, "aux");
    const Bytes bytes = at(value.source(), "aux", [&text] { return textOrHexBytes(text); });
    at(value.source(), [&bytes] { checkAux(bytes); });
    reading.unit.disk.aux = bytes;
    reading.places[auxKey()] = key.source();
}

TuningValue tuningValueOf(const toml::node& node, const std::string& name) {
    if (node.is_string()) {
        return node.as_string()->get();
    }
    if (const toml::array* array = node.as_array()) {
        std::vector<std::int64_t> numbers;
        for (const toml::node& element : *array) {
            numbers.push_back(numberOf(element, "an element of " + name));
        }
        return numbers;
    }
    if (!node.is_integer()) {
        failAt(node.source(), name +
                                  " must be a word, a whole number or a list of whole numbers, " +
                                  "not " + shown(node));
    }
    return node.as_integer()->get();
}

TuningDescription readTuningBlock(std::uint64_t id, const toml::table& table) {
    TuningDescription block;
    DpsBlock scratch{};
    for (const auto& [key, value] : table) {
        const std::string name(key.str());
        if (name == "raw") {
            block.raw = hexOf(value, "raw");
            at(value.source(), "raw", [&] { encodeTuningBlock({block.raw, {}}); });
        } else if (!isTuningField(name)) {
            failUnknown(key, valueName(tuningBlockKey(id)),
                        "raw and the " + std::to_string(DPS_LAYOUT.size()) +
                            " keys of a tuning file, such as " + DPS_LAYOUT.front().key);
        } else {
            const TuningValue fieldValue = tuningValueOf(value, name);
            at(value.source(), [&] { encodeTuningField(scratch, name, fieldValue); });
            block.fields.emplace(name, fieldValue);
        }
    }
    return block;
}

void readTuning(const toml::key& tableKey, const toml::node& node, DescriptionReading& reading) {
    for (const auto& [key, value] : tableOf(tableKey, node)) {
        const std::uint64_t id = numberOf(key, {0, DPS_BLOCK_COUNT - 1}, "a tuning block");
        const ValueKey block = tuningBlockKey(id);
        putOnce(reading.unit.disk.tuning, key, id, readTuningBlock(id, tableOf(key, value)),
                valueName(block));
        reading.places[block] = key.source();
    }
}

void readImageSize(const toml::key& /*key*/, const toml::node& node, DescriptionReading& reading) {
    reading.unit.image.size = static_cast<std::uint32_t>(
        numberUpTo(node, std::numeric_limits<std::uint32_t>::max(), "the image's size"));
}

void readImageBytes(const toml::key& key, const toml::node& node, DescriptionReading& reading) {
    readBytes(tableOf(key, node), reading.unit.image.bytes, imageBytesKey, reading);
}

void readDiskSize(const toml::key& /*key*/, const toml::node& node, DescriptionReading& reading) {
    reading.unit.disk.size =
        numberUpTo(node, std::numeric_limits<std::int64_t>::max(), "the disk's size");
}

void readDiskBytes(const toml::key& key, const toml::node& node, DescriptionReading& reading) {
    readBytes(tableOf(key, node), reading.unit.disk.bytes, diskBytesKey, reading);
}

constexpr TableEntry IMAGE_ENTRIES[] = {
    {"size", readImageSize},
    {"params", readParams},
    {"bytes", readImageBytes},
};

constexpr TableEntry DISK_ENTRIES[] = {
    {"size", readDiskSize}, {"slots", readSlots},     {"aux", readAux},
    {"tuning", readTuning}, {"bytes", readDiskBytes},
};

} // namespace

void readImage(const toml::key& key, const toml::node& node, DescriptionReading& reading) {
    readEntries(tableOf(key, node), "[image]", IMAGE_ENTRIES, reading);
}

void readDisk(const toml::key& key, const toml::node& node, DescriptionReading& reading) {
    readEntries(tableOf(key, node), "[disk]", DISK_ENTRIES, reading);
}

} // namespace orvane::kit
