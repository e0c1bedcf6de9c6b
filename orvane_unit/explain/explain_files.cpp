// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/explain/explain_files.h"

#include "identity/software_version.h"
#include "identity/vehicle_identity.h"
#include "orvane_unit/explain/planned_merge.h"
#include "orvane_unit/explain/reasons.h"
#include "orvane_unit/explain/value_origins.h"
#include "orvane_unit/explain/version_choice.h"
#include "tuning/audio_profile.h"
#include "tuning/dps_block.h"
#include "tuning/tuning_file.h"
#include "writers/airplay_writer.h"
#include "writers/iap_writer.h"
#include "writers/template_merge.h"

#include <array>
#include <cstddef>
#include <cstdint>
#include <sstream>
#include <string>
#include <utility>
#include <vector>

namespace orvane::desk {

namespace {

const std::string AUDIO_PROFILE_KEY = "param." + std::to_string(AUDIO_PROFILE_PARAM);

struct TuningFile {
    std::int32_t blockId;
    const char* path;
};

/// In the order in which the audio profile has them written.
constexpr TuningFile TUNING_FILES[] = {
    {DPS_BLOCK_TELEPHONY, TELEPHONY_TUNING_FILE},
    {DPS_BLOCK_SPEECHREC, SPEECHREC_TUNING_FILE},
};

Output tuningNotAsked(const TuningFile& file, Reason reason) {
    Output output;
    output.path = file.path;
    output.outcome = Outcome::notAsked;
    output.reasons = {reason};
    output.keys = {AUDIO_PROFILE_KEY};
    return output;
}

Output generatedTuning(PlannedFiles& files, const TuningFile& file) {
    Output output;
    output.path = file.path;
    output.keys = {AUDIO_PROFILE_KEY, std::string("file.") + file.path};
    // The disk first, as the tool reads it before it opens the file.
    const TuningArea area = readTuningBlocks();
    if (!files.openForWriting(file.path)) {
        output.outcome = Outcome::kept;
        output.reasons = {Reason::outputNotOpenable};
        return output;
    }
    output.reasons = {Reason::generated};
    std::ostringstream text;
    writeTuningText(text, file.blockId, area.blocks.at(static_cast<std::size_t>(file.blockId)));
    std::istringstream lines(text.str());
    std::string line;
    std::getline(lines, line);
    output.lines.push_back({line + "\n", {Reason::fixedText}, "", ""});
    for (const DpsField& field : DPS_LAYOUT) {
        std::getline(lines, line);
        const Origin origin = fieldOrigin(area, file.blockId, field);
        output.lines.push_back({line + "\n", origin.reasons, origin.key, origin.detail});
    }
    files.write(file.path, text.str());
    return output;
}

/// A value as the iAP files carry it: up to its first NUL byte.
std::string upToNul(const std::string& text) {
    return text.substr(0, text.find('\0'));
}

std::vector<Line> iapLines(const std::string& head, const IapValues& values, const Origin& model,
                           const Origin& serial, const Origin& version) {
    return headLines(head, {{"model=", upToNul(values.model), model},
                            {"serial=", upToNul(values.serial), serial},
                            {"firmware_version=", upToNul(values.firmwareVersion), version}});
}

std::string textOf(void (*write)(std::ostream&, const IapValues&), const IapValues& values) {
    std::ostringstream text;
    write(text, values);
    return text.str();
}

Output mergeOrStock(PlannedMerge& merge, const AccessoryFile& file, std::vector<Line> lines,
                    const std::string& end) {
    if (!merge.outputIsOpen()) {
        return merge.keep();
    }
    if (!merge.templateIsOpen()) {
        return merge.installStock(Reason::templateMissing,
                                  std::string("file.") + file.templateFile);
    }
    return merge.generate(std::move(lines), end);
}

} // namespace

void explainAirplay(PlannedFiles& files, Explanation& outputs) {
    const Image image = readImage();
    AirplayValues values;
    getModelName(values.model);
    getBrandName(values.brand);
    values.rightHandDrive = getRightHandDrive();
    std::uint16_t profile = 0;
    const Origin profileOrigin = paramOrigin(image, AUDIO_PROFILE_PARAM);
    if (readAudioProfile(profile)) {
        values.audioProfile = profile;
    }
    for (const TuningFile& file : TUNING_FILES) {
        if (values.audioProfile == AUDIO_PROFILE_GENERATED) {
            outputs.push_back(generatedTuning(files, file));
        } else {
            outputs.push_back(tuningNotAsked(file, values.audioProfile == NO_AUDIO_PROFILE
                                                       ? Reason::profileUnknown
                                                       : Reason::profileNotGenerated));
        }
    }

    PlannedMerge merge(files, AIRPLAY_FILE);
    std::ostringstream head;
    writeAirplayHead(head, values);
    const bool hasProfile = values.audioProfile != NO_AUDIO_PROFILE;
    const std::vector<HeadValue> headValues = {
        {"model = ", values.model, modelOrigin(image)},
        {"oemIconPath = /fs/mp/etc/", values.brand + "/oemIcon.png",
         paramOrigin(image, BRAND_PARAM)},
        {hasProfile ? "audioProfile = " : "", std::to_string(values.audioProfile), profileOrigin},
        {"rightHandDrive = ", std::to_string(values.rightHandDrive),
         paramOrigin(image, RIGHT_HAND_DRIVE_PARAM)},
    };
    outputs.push_back(mergeOrStock(merge, AIRPLAY_FILE, headLines(head.str(), headValues), ""));
}

void explainIap(PlannedFiles& files, Explanation& outputs) {
    IapValues values;
    getUnitSerial(values.serial);
    getModelName(values.model);
    values.firmwareVersion = findApplicationVersion();
    const Origin serial = serialOrigin();
    const Origin model = modelOrigin(readImage());
    const VersionFiles versions = readVersionFiles();
    const Origin text = versionTextOrigin(versions);
    const std::vector<Line> iap2Head =
        iapLines(textOf(writeIap2Head, values), values, model, serial, text);

    PlannedMerge device(files, IAP2_DEVICE_FILE);
    outputs.push_back(mergeOrStock(device, IAP2_DEVICE_FILE, iap2Head, IAP2_DEVICE_END));

    PlannedMerge iap2(files, IAP2_FILE);
    outputs.push_back(mergeOrStock(iap2, IAP2_FILE, iap2Head, ""));

    values.firmwareVersion = softwareVersion();
    const std::vector<Line> iap1Head = iapLines(textOf(writeIap1Head, values), values, model,
                                                serial, versionDigitsOrigin(versions));
    PlannedMerge iap1(files, IAP1_FILE);
    if (!iap1.outputIsOpen()) {
        outputs.push_back(iap1.keep());
    } else if (!iap2.outputIsOpen()) {
        outputs.push_back(
            iap1.installStock(Reason::iap2NotOpened, std::string("file.") + IAP2_FILE.output));
    } else if (iap2.templateIsEmpty()) {
        outputs.push_back(iap1.installStock(Reason::iap2TemplateEmpty,
                                            std::string("file.") + IAP2_FILE.templateFile));
    } else {
        outputs.push_back(iap1.generate(iap1Head, ""));
    }
}

} // namespace orvane::desk
