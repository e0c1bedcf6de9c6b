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

#include <cstdint>
#include <limits>
#include <map>
#include <optional>
#include <string>
#include <type_traits>
#include <variant>
#include <vector>

namespace orvane::kit {

namespace {

void readParams(const toml::table& table, DescriptionReading& reading) {
    for (const auto& [key, value] : table) {
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

void readSlots(const toml::table& table, DescriptionReading& reading) {
    for (const auto& [key, value] : table) {
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
                        "raw and the 44 keys of a tuning file, such as qwaAECSwitch");
        } else {
            const TuningValue fieldValue = tuningValueOf(value, name);
            at(value.source(), [&] { encodeTuningField(scratch, name, fieldValue); });
            block.fields.emplace(name, fieldValue);
        }
    }
    return block;
}

void readTuning(const toml::table& table, DescriptionReading& reading) {
    for (const auto& [key, value] : table) {
        const std::uint64_t id = numberOf(key, {0, DPS_BLOCK_COUNT - 1}, "a tuning block");
        const ValueKey block = tuningBlockKey(id);
        putOnce(reading.unit.disk.tuning, key, id, readTuningBlock(id, tableOf(key, value)),
                valueName(block));
        reading.places[block] = key.source();
    }
}

} // namespace

void readImage(const toml::table& table, DescriptionReading& reading) {
    ImageDescription& image = reading.unit.image;
    for (const auto& [key, value] : table) {
        if (key == "size") {
            image.size = static_cast<std::uint32_t>(
                numberUpTo(value, std::numeric_limits<std::uint32_t>::max(), "the image's size"));
        } else if (key == "params") {
            readParams(tableOf(key, value), reading);
        } else if (key == "bytes") {
            readBytes(tableOf(key, value), image.bytes, reading, imageBytesKey);
        } else {
            failUnknown(key, "[image]", "size, params, bytes");
        }
    }
}

void readDisk(const toml::table& table, DescriptionReading& reading) {
    DiskDescription& disk = reading.unit.disk;
    for (const auto& [key, value] : table) {
        if (key == "size") {
            disk.size =
                numberUpTo(value, std::numeric_limits<std::int64_t>::max(), "the disk's size");
        } else if (key == "slots") {
            readSlots(tableOf(key, value), reading);
        } else if (key == "aux") {
            readAux(key, value, reading);
        } else if (key == "tuning") {
            readTuning(tableOf(key, value), reading);
        } else if (key == "bytes") {
            readBytes(tableOf(key, value), disk.bytes, reading, diskBytesKey);
        } else {
            failUnknown(key, "[disk]", "size, slots, aux, tuning, bytes");
        }
    }
}

} // namespace orvane::kit
