// SPDX-License-Identifier: Apache-2.0
#include "kit/description_values.h"
#include "kit/toml_values.h"
#include "kit/tuning_encode.h"
#include "kit/unit.h"
#include "kit/unit_checks.h"

#include <algorithm>
#include <fstream>
#include <limits>
#include <sstream>

namespace orvane::kit {

namespace {

/// Most bytes of a repeated text: a slip of the finger shall not fill the disk.
constexpr std::uint64_t REPEAT_LIMIT = std::uint64_t{1} << 30;

std::vector<std::string> pathsOf(const toml::key& key, const toml::node& node) {
    const toml::array* array = node.as_array();
    if (array == nullptr) {
        failAt(node.source(), "\"" + std::string(key.str()) + "\" must be a list of paths");
    }
    std::vector<std::string> paths;
    for (const toml::node& element : *array) {
        paths.push_back(textOf(element, "a path"));
        at(element.source(), [&paths] { checkUnitPath(paths.back()); });
    }
    return paths;
}

/// A table of raw bytes in hex by offset.
template <class Map>
void readBytes(const toml::table& table, Map& bytes) {
    constexpr std::uint64_t GREATEST =
        std::min<std::uint64_t>(std::numeric_limits<typename Map::key_type>::max(),
                                std::numeric_limits<std::int64_t>::max());
    for (const auto& [key, value] : table) {
        const std::uint64_t offset =
            at(key.source(), [&k = key] { return keyNumber(k.str(), GREATEST, "an offset"); });
        const std::string& text = textOf(value, "hex");
        putOnce(bytes, key, offset, at(value.source(), [&text] { return hexBytes(text); }));
    }
}

void readParams(const toml::table& table, ImageDescription& image) {
    for (const auto& [key, value] : table) {
        const auto number = static_cast<std::uint16_t>(at(
            key.source(), [&k = key] { return keyNumber(k.str(), 0xFFFF, "a parameter number"); }));
        const std::int64_t content = numberOf(value, "a parameter's value");
        at(value.source(), [&] { checkParam(number, content); });
        putOnce(image.params, key, number, static_cast<std::uint16_t>(content));
    }
}

void readImage(const toml::table& table, ImageDescription& image) {
    for (const auto& [key, value] : table) {
        if (key == "size") {
            image.size = static_cast<std::uint32_t>(
                numberUpTo(value, std::numeric_limits<std::uint32_t>::max(), "the image's size"));
        } else if (key == "params") {
            readParams(tableOf(key, value), image);
        } else if (key == "bytes") {
            readBytes(tableOf(key, value), image.bytes);
        } else {
            failUnknown(key, "[image]", "size, params, bytes");
        }
    }
}

void readSlots(const toml::table& table, DiskDescription& disk) {
    for (const auto& [key, value] : table) {
        const auto slot = static_cast<std::uint32_t>(
            at(key.source(), [&k = key] { return keyNumber(k.str(), 0xFFFFFFFF, "a slot"); }));
        const std::string& text = textOf(value, "a slot's content");
        const Bytes bytes = at(value.source(), [&text] { return textOrHexBytes(text); });
        at(value.source(), [&] { checkSlot(slot, bytes); });
        putOnce(disk.slots, key, slot, bytes);
    }
}

void readAux(const toml::node& node, DiskDescription& disk) {
    const std::string& text = textOf(node, "the auxiliary area's content");
    at(node.source(), [&] {
        disk.aux = textOrHexBytes(text);
        checkAux(*disk.aux);
    });
}

TuningValue tuningValueOf(const toml::node& node) {
    if (node.is_string()) {
        return node.as_string()->get();
    }
    if (const toml::array* array = node.as_array()) {
        std::vector<std::int64_t> numbers;
        for (const toml::node& element : *array) {
            numbers.push_back(numberOf(element, "an element"));
        }
        return numbers;
    }
    return numberOf(node, "a tuning value that is no word and no list");
}

TuningDescription readTuningBlock(const toml::table& table) {
    TuningDescription block;
    DpsBlock scratch{};
    for (const auto& [key, value] : table) {
        const std::string name(key.str());
        if (name == "raw") {
            const std::string& text = textOf(value, "hex");
            at(value.source(), [&] {
                block.raw = hexBytes(text);
                encodeTuningBlock(block); // only for its refusals, while the place is known
            });
            continue;
        }
        const TuningValue fieldValue = tuningValueOf(value);
        at(key.source(), [&name] { tuningField(name); });
        at(value.source(), [&] { encodeTuningField(scratch, name, fieldValue); });
        block.fields.emplace(name, fieldValue);
    }
    return block;
}

void readTuning(const toml::table& table, DiskDescription& disk) {
    for (const auto& [key, value] : table) {
        const std::uint64_t id = at(key.source(), [&k = key] {
            return keyNumber(k.str(), DPS_BLOCK_COUNT - 1, "a tuning block");
        });
        putOnce(disk.tuning, key, id, readTuningBlock(tableOf(key, value)));
    }
}

void readDisk(const toml::table& table, DiskDescription& disk) {
    for (const auto& [key, value] : table) {
        if (key == "size") {
            disk.size =
                numberUpTo(value, std::numeric_limits<std::int64_t>::max(), "the disk's size");
        } else if (key == "slots") {
            readSlots(tableOf(key, value), disk);
        } else if (key == "aux") {
            readAux(value, disk);
        } else if (key == "tuning") {
            readTuning(tableOf(key, value), disk);
        } else if (key == "bytes") {
            readBytes(tableOf(key, value), disk.bytes);
        } else {
            failUnknown(key, "[disk]", "size, slots, aux, tuning, bytes");
        }
    }
}

/// The two ways to give a file's content besides a text.
Bytes readContentTable(const toml::table& table) {
    const toml::node* hex = table.get("hex");
    const toml::node* repeat = table.get("repeat");
    const toml::node* count = table.get("count");
    if (hex != nullptr && table.size() == 1) {
        const std::string& text = textOf(*hex, "hex");
        return at(hex->source(), [&text] { return hexBytes(text); });
    }
    if (repeat == nullptr || count == nullptr || table.size() != 2) {
        failAt(table.source(), "a file's content must be a text, { hex = \"...\" } or { repeat = "
                               "\"...\", count = ... }");
    }
    const std::string& text = textOf(*repeat, "the text to repeat");
    const std::uint64_t times = numberUpTo(
        *count, REPEAT_LIMIT / std::max<std::uint64_t>(1, text.size()), "the count of repeats");
    Bytes content;
    content.reserve(text.size() * static_cast<std::size_t>(times));
    for (std::uint64_t i = 0; i < times; ++i) {
        content += text;
    }
    return content;
}

void readFiles(const toml::table& table, std::map<std::string, Bytes>& files) {
    for (const auto& [key, value] : table) {
        const std::string path(key.str());
        at(key.source(), [&path] { checkUnitPath(path); });
        const toml::table* content = value.as_table();
        files[path] =
            content != nullptr ? readContentTable(*content) : textOf(value, "a file's content");
    }
}

} // namespace

UnitDescription parseDescription(const std::string& text, const std::string& name) {
    toml::table table;
    try {
        table = toml::parse(text, name);
    } catch (const toml::parse_error& error) {
        failAt(error.source(), std::string(error.description()));
    }
    UnitDescription unit;
    for (const auto& [key, value] : table) {
        if (key == "folders") {
            unit.folders = pathsOf(key, value);
        } else if (key == "absent") {
            unit.absent = pathsOf(key, value);
        } else if (key == "image") {
            readImage(tableOf(key, value), unit.image);
        } else if (key == "disk") {
            readDisk(tableOf(key, value), unit.disk);
        } else if (key == "files") {
            readFiles(tableOf(key, value), unit.files);
        } else {
            failUnknown(key, "a unit", "folders, absent, image, disk, files");
        }
    }
    for (const std::string& folder : unit.folders) {
        if (unit.files.count(folder) != 0) {
            failAt(table.get("folders")->source(), folder + " is both a file and a folder");
        }
    }
    return unit;
}

UnitDescription readDescription(const std::filesystem::path& file) {
    std::error_code error;
    if (std::filesystem::is_directory(file, error)) {
        throw KitError(file.string() + " is a folder, not a description");
    }
    std::ifstream in(file, std::ios::binary);
    if (!in) {
        throw systemError("cannot read " + file.string());
    }
    std::ostringstream text;
    text << in.rdbuf(); // an empty file fails the copy, and is a description all the same
    if (in.bad() || text.bad()) {
        throw KitError("cannot read " + file.string());
    }
    return parseDescription(text.str(), file.string());
}

} // namespace orvane::kit
