// SPDX-License-Identifier: Apache-2.0
#include "kit/unit/unit_values.h"

#include "config/boot_disk.h"
#include "config/config_store.h"
#include "config/crc32.h"
#include "config/param_catalogue.h"
#include "config/record_slots.h"
#include "kit/description/description_values.h"
#include "kit/description/unit_layout.h"
#include "kit/description/value_places.h"
#include "kit/host/bytes.h"
#include "kit/host/text.h"
#include "kit/tuning/tuning_description.h"
#include "kit/tuning/tuning_encode.h"
#include "tuning/dps_block.h"

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <map>
#include <optional>
#include <string_view>
#include <variant>

namespace orvane::kit {

namespace {

constexpr char MISSING[] = "(missing)";

/// Longer values are shown as their size and checksum.
constexpr std::size_t LONGEST_SHOWN = 64;

std::string crcText(const std::string& bytes) {
    std::uint32_t crc = CRC32_INITIAL;
    for (const char byte : bytes) {
        crc = crc32Step(crc, static_cast<std::uint8_t>(byte));
    }
    return hexDigits(~crc, 8);
}

std::string fileText(const std::string& bytes) {
    return counted(bytes.size(), "byte") + ", CRC-32 " + crcText(bytes);
}

/// As `orvane-unit set` takes it.
std::string textOrHex(const std::string& bytes) {
    if (printable(bytes) == bytes && !hasHexPrefix(bytes)) {
        return bytes;
    }
    std::string hex = hexText(bytes);
    hex.erase(std::remove(hex.begin(), hex.end(), ' '), hex.end());
    return hex.size() <= LONGEST_SHOWN ? std::string(HEX_PREFIX) + hex : fileText(bytes);
}

std::string tuningText(const TuningValue& value) {
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

/// `keyOf` gives the key of the bytes at an offset.
template <class Runs, class KeyOf>
void addRuns(UnitValues& values, const Runs& runs, const KeyOf& keyOf) {
    for (const auto& [offset, bytes] : runs) {
        values.emplace_back(keyOf(offset), textOrHex(bytes));
    }
}

bool isNamed(const UnitDescription& unit, const std::string& path) {
    const auto isAbsent = [&path](const std::string& absent) { return isAtOrBelow(path, absent); };
    return unit.files.count(path) != 0 || unit.sparseFiles.count(path) != 0 ||
           unit.links.count(path) != 0 ||
           std::find(unit.folders.begin(), unit.folders.end(), path) != unit.folders.end() ||
           std::any_of(unit.absent.begin(), unit.absent.end(), isAbsent);
}

void addImage(UnitValues& values, const ImageDescription& image) {
    values.emplace_back(imageSizeKey(), std::to_string(image.size));
    for (std::uint16_t number = 1; number <= PARAM_COUNT; ++number) {
        const auto param = image.params.find(number);
        values.emplace_back(paramKey(number),
                            std::to_string(param == image.params.end() ? 0 : param->second));
    }
    addRuns(values, image.bytes, imageBytesKey);
}

void addDisk(UnitValues& values, const DiskDescription& disk) {
    for (std::uint32_t slot = 0; slot < RECORD_SLOT_COUNT; ++slot) {
        const auto content = disk.slots.find(slot);
        if (slotsWithin(slot).empty()) { // else its bytes have keys already
            values.emplace_back(slotKey(slot),
                                content == disk.slots.end() ? "" : textOrHex(content->second));
        }
    }
    values.emplace_back(auxKey(), textOrHex(disk.aux.value_or("")));
    for (std::uint32_t id = 0; id < DPS_BLOCK_COUNT; ++id) {
        const auto block = disk.tuning.find(id);
        const TuningDescription zeros = describeTuningBlock(DpsBlock{});
        const TuningDescription& content = block == disk.tuning.end() ? zeros : block->second;
        for (const DpsField& field : DPS_LAYOUT) {
            values.emplace_back(tuningFieldKey(id, field.key),
                                tuningText(content.fields.at(field.key)));
        }
        values.emplace_back(tuningRawKey(id), textOrHex(content.raw));
    }
    addRuns(values, disk.bytes, diskBytesKey);
}

} // namespace

UnitValues unitValues(const UnitDescription& unit) {
    UnitValues values;
    if (!isNamed(unit, CONFIG_SHM_NAME)) {
        addImage(values, unit.image);
    }
    if (!isNamed(unit, BOOT_DISK)) {
        addDisk(values, unit.disk);
    }
    for (const auto& [path, content] : unit.files) {
        values.emplace_back(fileKey(path), fileText(content));
    }
    for (const auto& [path, content] : unit.sparseFiles) {
        values.emplace_back(fileKey(path), counted(content.size, "byte"));
        addRuns(values, content.bytes,
                [&p = path](std::uint64_t offset) { return fileBytesKey(p, offset); });
    }
    for (const auto& [path, target] : unit.links) {
        values.emplace_back(linkKey(path), textOrHex(target));
    }
    for (const std::string& path : unit.folders) {
        values.emplace_back(folderKey(path), "a folder");
    }
    for (const std::string& path : unit.absent) {
        values.emplace_back(absentKey(path), "removed");
    }
    return values;
}

std::vector<ValueChange> differingValues(const UnitValues& before, const UnitValues& after) {
    std::map<ValueKey, std::string> later(after.begin(), after.end());
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

} // namespace orvane::kit
