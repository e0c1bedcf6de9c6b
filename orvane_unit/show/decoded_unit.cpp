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
#include "kit/enter/entered_root.h"
#include "kit/host/sparse_content.h"
#include "main/unit_files.h"
#include "tuning/audio_profile.h"

#include <sys/stat.h>

#include <utility>

namespace orvane::desk {

namespace {

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
        meaning += ", generated from tuning blocks ";
        const char* separator = "";
        for (const TuningOutput& output : TUNING_OUTPUTS) {
            meaning += separator + std::to_string(output.blockId);
            separator = " and ";
        }
    }
    return meaning;
}

/// What the tool makes of parameter `number` of this unit.
std::string meaningOf(std::uint16_t number) {
    switch (number) {
    case RIGHT_HAND_DRIVE_PARAM:
        return "rightHandDrive " + std::to_string(getRightHandDrive());
    case BRAND_PARAM:
        return "brand " + textBy(getBrandName);
    case FUEL_TYPE_PARAM:
        return "fuel type " + textBy(getFuelType) + ", which is written nowhere";
    case AUDIO_PROFILE_PARAM:
        return profileMeaning(readAudioProfile());
    case MODEL_PARAM:
        return "model " + textBy(getModelName);
    default:
        return "";
    }
}

std::vector<Param> readParams(const Image& image) {
    ConfigStore store;
    store.init();
    const bool isOpen = store.open() == 0;
    std::vector<Param> params;
    for (std::uint16_t number = 1; number <= PARAM_COUNT; ++number) {
        Param param;
        std::int32_t index = 0;
        ParamInfo info{};
        lookupParam(number, index, param.row);
        describeParam(number, info);
        param.size = info.size;
        std::uint16_t value = 0; // one byte arrives in the low byte here, as in readAllParams
        if (isOpen && param.row.offset + param.size <= image.bytes.size() &&
            getParam(store, number, &value) == PARAM_OK) {
            param.raw = value;
        }
        param.meaning = meaningOf(number);
        params.push_back(std::move(param));
    }
    return params;
}

void readRecords(Contents& contents) {
    bool isBlank = false;
    for (std::uint32_t number = 0; number < RECORD_SLOT_COUNT; ++number) {
        Slot slot;
        slot.number = number;
        recordSlotLayout(number, slot.size, slot.offset);
        std::string bytes(slot.size, '\0');
        if (readRecordSlot(number, bytes.data(), slot.size) == 0) {
            slot.bytes = bytes;
            isBlank = number == CRC_RECORD_SLOT ? kit::withoutEndZeros(bytes).empty() : isBlank;
        }
        contents.slots.push_back(std::move(slot));
    }
    std::string aux(AUX_AREA_SIZE, '\0');
    if (readAuxArea(aux.data(), AUX_AREA_SIZE) == 0) {
        contents.aux = aux;
    }
    contents.crc = recordAreaCrc();
    constexpr std::uint32_t ALL_ONES = 0xFFFFFFFF;
    if (diskTrouble(CRC_RANGE_START)) {
        contents.crcVerdict = CrcVerdict::unreadable;
    } else if (contents.crc == ALL_ONES) {
        contents.crcVerdict = CrcVerdict::ambiguous;
    } else {
        contents.crcVerdict = isBlank ? CrcVerdict::blank : CrcVerdict::computed;
    }
}

UnitFile look(const std::string& path, const char* role) {
    UnitFile file{path, role, PathKind::nothing, 0};
    struct stat state {};
    if (::stat(path.c_str(), &state) != 0) {
        return file;
    }
    file.kind = S_ISREG(state.st_mode)   ? PathKind::file
                : S_ISDIR(state.st_mode) ? PathKind::folder
                                         : PathKind::other;
    file.size = file.kind == PathKind::file ? static_cast<std::uint64_t>(state.st_size) : 0;
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

const char* crcVerdictName(CrcVerdict verdict) {
    switch (verdict) {
    case CrcVerdict::computed:
        return "computed";
    case CrcVerdict::blank:
        return "blank";
    case CrcVerdict::ambiguous:
        return "ambiguous";
    case CrcVerdict::unreadable:
        return "unreadable";
    }
    return "";
}

Contents readContents(const std::filesystem::path& root) {
    const kit::EnteredRoot entered(root);
    Contents contents;
    contents.image = readImage();
    contents.params = readParams(contents.image);
    contents.diskSize = diskSize();
    contents.diskTrouble = diskTrouble(RECORD_AREA_SIZE);
    readRecords(contents);
    contents.tuning = readUnitTuning();
    contents.versions = readVersionFiles();
    contents.version = findApplicationVersion();
    contents.versionDigits = softwareVersion();
    contents.files = lookAtFiles();
    return contents;
}

} // namespace orvane::desk
