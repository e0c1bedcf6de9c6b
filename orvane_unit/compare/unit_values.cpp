// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/compare/unit_values.h"

#include "config/boot_disk.h"
#include "config/config_store.h"
#include "config/crc32.h"
#include "config/param_catalogue.h"
#include "config/record_slots.h"
#include "kit/host/text.h"
#include "kit/tuning/tuning_encode.h"
#include "kit/unit/describe_unit.h"
#include "orvane_unit/explain/value_origins.h"
#include "orvane_unit/show/decoded_unit.h"
#include "tuning/dps_block.h"

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <map>
#include <optional>
#include <sstream>
#include <unordered_map>
#include <variant>

namespace orvane::desk {

namespace {

constexpr char MISSING[] = "(missing)";

/// Longer values are told by their size and checksum.
constexpr std::size_t LONGEST_SHOWN = 64;

std::string crcText(const std::string& bytes) {
    std::uint32_t crc = CRC32_INITIAL;
    for (const char byte : bytes) {
        crc = crc32Step(crc, static_cast<std::uint8_t>(byte));
    }
    std::ostringstream text;
    text << std::hex << ~crc;
    return text.str();
}

std::string fileText(const std::string& bytes) {
    return kit::counted(bytes.size(), "byte") + ", CRC-32 " + crcText(bytes);
}

/// As `orvane-unit set` takes it.
std::string textOrHex(const std::string& bytes) {
    if (kit::printable(bytes) == bytes && bytes.compare(0, 4, "hex:") != 0) {
        return bytes;
    }
    std::string hex = kit::hexText(bytes);
    hex.erase(std::remove(hex.begin(), hex.end(), ' '), hex.end());
    return hex.size() <= LONGEST_SHOWN ? "hex:" + hex : fileText(bytes);
}

std::string tuningText(const kit::TuningValue& value) {
    if (const auto* word = std::get_if<std::string>(&value)) {
        return *word;
    }
    if (const auto* number = std::get_if<std::int64_t>(&value)) {
        return std::to_string(*number);
    }
    std::string text;
    for (const std::int64_t number : std::get<std::vector<std::int64_t>>(value)) {
        text += (text.empty() ? "" : ",") + std::to_string(number);
    }
    return text;
}

template <class Runs>
void addRuns(UnitValues& values, const std::string& prefix, const Runs& runs) {
    for (const auto& [offset, bytes] : runs) {
        values.emplace_back(prefix + std::to_string(offset), textOrHex(bytes));
    }
}

bool isNamed(const kit::UnitDescription& unit, const std::string& path) {
    const auto names = [&path](const std::string& other) {
        return path == other || path.compare(0, other.size() + 1, other + "/") == 0;
    };
    return unit.files.count(path) != 0 || unit.sparseFiles.count(path) != 0 ||
           unit.links.count(path) != 0 ||
           std::any_of(unit.folders.begin(), unit.folders.end(),
                       [&path](const std::string& other) { return path == other; }) ||
           std::any_of(unit.absent.begin(), unit.absent.end(), names);
}

void addImage(UnitValues& values, const kit::ImageDescription& image) {
    values.emplace_back("image.size", std::to_string(image.size));
    for (std::uint16_t number = 1; number <= PARAM_COUNT; ++number) {
        const auto param = image.params.find(number);
        values.emplace_back("param." + std::to_string(number),
                            std::to_string(param == image.params.end() ? 0 : param->second));
    }
    addRuns(values, "image.bytes.", image.bytes);
}

void addDisk(UnitValues& values, const kit::DiskDescription& disk) {
    for (std::uint32_t slot = 0; slot < RECORD_SLOT_COUNT; ++slot) {
        const auto content = disk.slots.find(slot);
        if (slot != CRC_RECORD_SLOT) {
            values.emplace_back("slot." + std::to_string(slot),
                                content == disk.slots.end() ? "" : textOrHex(content->second));
        }
    }
    values.emplace_back("aux", textOrHex(disk.aux.value_or("")));
    for (std::uint32_t id = 0; id < DPS_BLOCK_COUNT; ++id) {
        const auto block = disk.tuning.find(id);
        const std::string prefix = "tuning." + std::to_string(id) + ".";
        const kit::TuningDescription zeros = kit::describeTuningBlock(DpsBlock{});
        const kit::TuningDescription& content = block == disk.tuning.end() ? zeros : block->second;
        for (const DpsField& field : DPS_LAYOUT) {
            values.emplace_back(prefix + field.key, tuningText(content.fields.at(field.key)));
        }
        values.emplace_back(prefix + "raw", textOrHex(content.raw));
    }
    addRuns(values, "disk.bytes.", disk.bytes);
}

} // namespace

UnitValues unitValues(const kit::UnitDescription& unit) {
    UnitValues values;
    if (!isNamed(unit, CONFIG_SHM_NAME)) {
        addImage(values, unit.image);
    }
    if (!isNamed(unit, BOOT_DISK)) {
        addDisk(values, unit.disk);
    }
    for (const auto& [path, content] : unit.files) {
        values.emplace_back("file." + path, fileText(content));
    }
    for (const auto& [path, content] : unit.sparseFiles) {
        values.emplace_back("file." + path, kit::counted(content.size, "byte"));
        addRuns(values, "file." + path + ".", content.bytes);
    }
    for (const auto& [path, target] : unit.links) {
        values.emplace_back("link." + path, textOrHex(target));
    }
    for (const std::string& path : unit.folders) {
        values.emplace_back("folder." + path, "a folder");
    }
    for (const std::string& path : unit.absent) {
        values.emplace_back("absent." + path, "removed");
    }
    return values;
}

std::vector<ValueChange> differingValues(const UnitValues& before, const UnitValues& after) {
    std::unordered_map<std::string, std::string> later(after.begin(), after.end());
    std::vector<ValueChange> changes;
    for (const auto& [key, value] : before) {
        const auto found = later.find(key);
        const std::string now = found == later.end() ? MISSING : found->second;
        if (now != value) {
            changes.push_back({key, value, now});
        }
        if (found != later.end()) {
            later.erase(found);
        }
    }
    for (const auto& [key, value] : after) {
        if (later.count(key) != 0) {
            changes.push_back({key, MISSING, value});
        }
    }
    return changes;
}

} // namespace orvane::desk
