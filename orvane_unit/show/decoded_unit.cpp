// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/show/decoded_unit.h"

#include "config/boot_disk.h"
#include "config/config_store.h"
#include "config/param_access.h"
#include "config/record_area.h"
#include "config/record_slots.h"
#include "identity/software_version.h"
#include "identity/vehicle_identity.h"
#include "kit/description/unit_description.h"
#include "kit/description/value_places.h"
#include "kit/enter/entered_root.h"
#include "kit/host/bytes.h"
#include "kit/host/host_file.h"
#include "kit/host/lost_pages.h"
#include "kit/host/sparse_content.h"
#include "kit/host/tree_entries.h"
#include "kit/unit/describe_unit.h"
#include "main/unit_files.h"
#include "tuning/audio_profile.h"
#include "writers/template_merge.h"

#include <cstddef>
#include <utility>

namespace orvane::desk {

namespace {

namespace fs = std::filesystem;

std::string textBy(void (*lookup)(std::string&)) {
    std::string text;
    lookup(text);
    return text;
}

std::string profileMeaning(std::int32_t profile) {
    if (profile == NO_AUDIO_PROFILE) {
        return "no audio profile";
    }
    std::string meaning = "audio profile " + std::to_string(profile);
    if (asksForTuning(profile)) {
        const char* separator = ", generated from tuning blocks ";
        for (const TuningOutput& output : TUNING_OUTPUTS) {
            meaning += separator + std::to_string(output.blockId);
            separator = " and ";
        }
    }
    return meaning;
}

DecodedIdentity decodeIdentity() {
    return {textBy(getModelName),  textBy(getBrandName), textBy(getFuelType),
            textBy(getUnitSerial), getRightHandDrive(),  readAudioProfile()};
}

/// What the tool makes of parameter `number`.
std::string meaningOf(std::uint16_t number, const DecodedIdentity& identity) {
    switch (number) {
    case RIGHT_HAND_DRIVE_PARAM:
        return "right-hand drive " + std::to_string(identity.rightHandDrive);
    case BRAND_PARAM:
        return "brand " + identity.brand;
    case FUEL_TYPE_PARAM:
        return "fuel type " + identity.fuelType + ", which is not written";
    case AUDIO_PROFILE_PARAM:
        return profileMeaning(identity.audioProfile);
    case MODEL_PARAM:
        return "model " + identity.model;
    default:
        return "";
    }
}

std::vector<DecodedParam> decodeParams(const Image& image, const DecodedIdentity& identity) {
    ConfigStore store;
    store.init();
    const bool isOpen = store.open() == 0;
    std::vector<DecodedParam> params;
    for (std::uint16_t number = 1; number <= PARAM_COUNT; ++number) {
        DecodedParam param;
        param.row = kit::paramRow(number);
        param.code = param.row.id >> 16U;
        param.size = kit::paramPlace(number).size;
        std::uint16_t value = 0; // one byte arrives in the low byte here, as in readAllParams
        if (isOpen && param.row.offset + param.size <= image.size &&
            getParam(store, number, &value) == PARAM_OK) {
            param.raw = value;
        }
        param.meaning = meaningOf(number, identity);
        params.push_back(std::move(param));
    }
    return params;
}

CrcVerdict verdictOn(const DecodedRecords& records) {
    constexpr std::uint32_t ALL_ONES = 0xFFFFFFFF;
    if (diskTrouble(CRC_RANGE_START)) {
        return CrcVerdict::unreadable;
    }
    if (records.crc == ALL_ONES) {
        return CrcVerdict::ambiguous;
    }
    const std::optional<std::string>& range = records.slots.at(CRC_RECORD_SLOT).bytes;
    return range && kit::withoutTrailingZeros(*range).empty() ? CrcVerdict::blank
                                                              : CrcVerdict::computed;
}

/// What the record area holds besides its slots, the auxiliary area and the tuning blocks.
kit::SparseContent restOfRecords(std::uint64_t diskSize) {
    constexpr std::uint64_t AREA = RECORD_AREA_SIZE;
    if (diskSize < AREA || diskTrouble(RECORD_AREA_SIZE)) {
        return {};
    }
    const kit::Bytes area =
        kit::readAt(kit::openForReading(BOOT_DISK), BOOT_DISK, diskSize - AREA, AREA);
    return kit::describeDisk(area).bytes;
}

DecodedRecords decodeRecords() {
    DecodedRecords records;
    records.diskTrouble = diskTrouble(RECORD_AREA_SIZE);
    records.diskSize = diskSize();
    for (std::uint32_t number = 0; number < RECORD_SLOT_COUNT; ++number) {
        const kit::SlotPlace place = kit::slotPlace(number);
        DecodedSlot slot{number, place.size, place.offset, std::nullopt};
        std::string bytes(place.size, '\0');
        if (readRecordSlot(number, bytes.data(), place.size) == 0) {
            slot.bytes = bytes;
        }
        records.slots.push_back(std::move(slot));
    }
    std::string aux(AUX_AREA_SIZE, '\0');
    if (readAuxArea(aux.data(), AUX_AREA_SIZE) == 0) {
        records.aux = aux;
    }
    records.rest = restOfRecords(records.diskSize);
    records.crc = recordAreaCrc();
    records.crcVerdict = verdictOn(records);
    return records;
}

UnitFile look(const std::string& path, const char* role) {
    const fs::file_type type = kit::kindBehind(path);
    UnitFile file{path, role, PathKind::other, 0};
    if (type == fs::file_type::not_found) {
        file.kind = PathKind::nothing;
    } else if (type == fs::file_type::directory) {
        file.kind = PathKind::folder;
    } else if (type == fs::file_type::regular) {
        file.kind = PathKind::file;
        file.size = fs::file_size(path);
    }
    return file;
}

std::vector<UnitFile> lookAtFiles() {
    std::vector<UnitFile> files = {look(CONFIG_SHM_NAME, "configuration image"),
                                   look(BOOT_DISK, "boot disk"),
                                   look(VERSION_DIR, "version description files")};
    for (const AccessoryFile& file : ACCESSORY_FILES) {
        files.push_back(look(file.templateFile, "template"));
        files.push_back(look(file.stockFile, "stock file"));
    }
    for (const AccessoryFile& file : ACCESSORY_FILES) {
        files.push_back(look(file.output, "output"));
    }
    for (const TuningOutput& output : TUNING_OUTPUTS) {
        files.push_back(look(output.path, "output"));
    }
    return files;
}

} // namespace

std::vector<std::string> partNames() {
    std::vector<std::string> names;
    forEachPart({}, [&names](const char* name, const auto& /*part*/) { names.push_back(name); });
    return names;
}

DecodedUnit decodeUnit(const std::filesystem::path& root) {
    const kit::EnteredRoot entered(root);
    const kit::LostPages lost;
    DecodedUnit unit;
    unit.image.found = readImage();
    unit.records = decodeRecords();
    unit.identity = decodeIdentity(); // after these looks: the tool would wait at a pipe
    unit.image.params = decodeParams(unit.image.found, unit.identity);
    unit.tuning = readUnitTuning();
    unit.versions = {readVersionFiles(), findApplicationVersion(), softwareVersion()};
    unit.files = lookAtFiles();
    lost.requireNone(CONFIG_SHM_NAME);
    return unit;
}

} // namespace orvane::desk
