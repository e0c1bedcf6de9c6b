// SPDX-License-Identifier: Apache-2.0
#include "kit/description/description_text.h"

#include "kit/description/parse_description.h"
#include "kit/description/toml_text.h"
#include "kit/host/bytes.h"
#include "kit/host/kit_error.h"
#include "kit/tuning/tuning_description.h"
#include "tuning/dps_block.h"

#include <array>
#include <cstddef>
#include <cstdint>
#include <map>
#include <optional>
#include <utility>
#include <variant>
#include <vector>

namespace orvane::kit {

namespace {

/// The fewest equal bytes that are written as a repeat.
constexpr std::size_t LONG_REPEAT = 64;

std::string listText(const std::vector<std::int64_t>& numbers) {
    std::string text;
    for (const std::int64_t number : numbers) {
        text += (text.empty() ? "" : ", ") + std::to_string(number);
    }
    return "[" + text + "]";
}

std::string valueText(const TuningValue& value) {
    if (const auto* word = std::get_if<std::string>(&value)) {
        return tomlText(*word);
    }
    if (const auto* list = std::get_if<std::vector<std::int64_t>>(&value)) {
        return listText(*list);
    }
    return std::to_string(std::get<std::int64_t>(value));
}

/// A table of raw bytes by offset, if there are any.
template <class Map>
void addBytes(const std::string& table, const Map& bytes, std::string& text) {
    text += bytes.empty() ? "" : "\n[" + table + "]\n";
    for (const auto& [offset, content] : bytes) {
        text += std::to_string(offset) + " = " + tomlHex(content) + "\n";
    }
}

void addPaths(const char* key, const std::vector<std::string>& paths, std::string& text) {
    if (paths.empty()) {
        return;
    }
    text += key + std::string(" = [\n");
    for (const std::string& path : paths) {
        text += "    " + tomlPath(path) + ",\n";
    }
    text += "]\n";
}

void addImage(const ImageDescription& image, std::string& text) {
    text += "\n[image]\nsize = " + std::to_string(image.size) + "\n";
    text += image.params.empty() ? "" : "\n[image.params]\n";
    for (const auto& [number, value] : image.params) {
        text += std::to_string(number) + " = " + std::to_string(value) + "\n";
    }
    addBytes("image.bytes", image.bytes, text);
}

void addTuning(std::uint32_t id, const TuningDescription& block, std::string& text) {
    text += "\n[disk.tuning." + std::to_string(id) + "]\n";
    if (!block.raw.empty()) {
        text += "raw = " + tomlHex(block.raw) + "\n";
    }
    for (const DpsField& field : DPS_LAYOUT) {
        const auto value = block.fields.find(field.key);
        if (value != block.fields.end()) {
            text += value->first + " = " + valueText(value->second) + "\n";
        }
    }
}

void addDisk(const DiskDescription& disk, std::string& text) {
    text += "\n[disk]\nsize = " + std::to_string(disk.size) + "\n";
    text += disk.aux ? "aux = " + tomlTextOrHex(*disk.aux) + "\n" : "";
    text += disk.slots.empty() ? "" : "\n[disk.slots]\n";
    for (const auto& [slot, bytes] : disk.slots) {
        text += std::to_string(slot) + " = " + tomlTextOrHex(bytes) + "\n";
    }
    for (const auto& [id, block] : disk.tuning) {
        addTuning(id, block, text);
    }
    addBytes("disk.bytes", disk.bytes, text);
}

std::string contentText(const Bytes& content) {
    const bool isOneByteOnly =
        content.size() >= LONG_REPEAT && content.find_first_not_of(content[0]) == Bytes::npos;
    if (isOneByteOnly) {
        const Bytes part = content.substr(0, 1);
        return "{ repeat = " +
               (isReadable(part) ? tomlText(part) : "{ hex = " + tomlHex(part) + " }") +
               ", count = " + std::to_string(content.size()) + " }";
    }
    return isReadable(content) ? tomlLines(content) : "{ hex = " + tomlHex(content) + " }";
}

void addFiles(const UnitDescription& unit, std::string& text) {
    text += unit.files.empty() ? "" : "\n[files]\n";
    for (const auto& [path, content] : unit.files) {
        text += tomlPath(path) + " = " + contentText(content) + "\n";
    }
    for (const auto& [path, content] : unit.sparseFiles) {
        const std::string table = "files." + tomlPath(path);
        text += "\n[" + table + "]\nsize = " + std::to_string(content.size) + "\n";
        addBytes(table + ".bytes", content.bytes, text);
    }
}

void addLinks(const UnitDescription& unit, std::string& text) {
    text += unit.links.empty() ? "" : "\n[links]\n";
    for (const auto& [path, target] : unit.links) {
        text += tomlPath(path) + " = " + tomlPath(target) + "\n";
    }
}

} // namespace

std::string descriptionText(const UnitDescription& unit) {
    std::string text;
    // Keys of no table must come before the first table.
    addPaths("folders", unit.folders, text);
    addPaths("absent", unit.absent, text);
    addImage(unit.image, text);
    addDisk(unit.disk, text);
    addFiles(unit, text);
    addLinks(unit, text);
    if (text.size() > LONGEST_DESCRIPTION) {
        throw KitError("the description has " + std::to_string(text.size()) +
                       " bytes: one of more than " + std::to_string(LONGEST_DESCRIPTION) +
                       " can't be read again");
    }
    return text.front() == '\n' ? text.substr(1) : text;
}

} // namespace orvane::kit
