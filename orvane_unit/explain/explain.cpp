// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/explain/explain.h"

#include "config/boot_disk.h"
#include "config/config_store.h"
#include "identity/vehicle_identity.h"
#include "kit/description/value_key.h"
#include "kit/host/kit_error.h"
#include "kit/host/lost_pages.h"
#include "main/options.h"
#include "orvane_unit/explain/given_options.h"
#include "orvane_unit/explain/planned_files.h"
#include "orvane_unit/explain/planned_merge.h"
#include "orvane_unit/explain/reasons.h"
#include "orvane_unit/explain/value_lines.h"
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
#include <functional>
#include <sstream>
#include <stdexcept>
#include <string>
#include <utility>
#include <variant>
#include <vector>

namespace orvane::desk {

namespace {

/// Requires that no output so far is the file `input`.
void requireUnwritten(const Explanation& outputs, const std::string& input) {
    for (const Output& output : outputs) {
        if (output.outcome != Outcome::kept && output.outcome != Outcome::notAsked) {
            PlannedFiles::requireTwoFiles(output.path, input);
        }
    }
}

Output tuningNotAsked(const TuningOutput& tuning, std::int32_t profile) {
    Output output;
    output.path = tuning.path;
    output.outcome = Outcome::notAsked;
    output.reasons = {profile == NO_AUDIO_PROFILE ? Reason::profileUnknown
                                                  : Reason::profileNotGenerated};
    output.keys = {kit::paramKey(AUDIO_PROFILE_PARAM)};
    return output;
}

/// The lines of a tuning file, each with the field that it renders.
std::vector<Line> tuningLines(const std::string& text, const TuningArea& area,
                              std::int32_t blockId) {
    const DpsBlock& block = area.blocks.at(static_cast<std::size_t>(blockId));
    std::vector<ValueRegion> regions;
    std::size_t done = 0;
    for (const DpsField& field : DPS_LAYOUT) {
        std::ostringstream line;
        writeTuningLine(line, field, block);
        const std::size_t begin = text.find(line.str(), done);
        if (begin == std::string::npos) {
            throw std::logic_error(std::string("error in orvane-unit: no line carries ") +
                                   field.key);
        }
        done = begin + line.str().size();
        regions.push_back({begin, done, fieldOrigin(area, blockId, field)});
    }
    return cutIntoLines(text, std::move(regions));
}

Output generatedTuning(PlannedFiles& files, const TuningOutput& tuning) {
    Output output;
    output.path = tuning.path;
    output.keys = {kit::paramKey(AUDIO_PROFILE_PARAM), kit::fileKey(tuning.path)};
    const TuningArea area = readUnitTuning(); // before the file is opened, as the tool does
    if (!files.openForWriting(tuning.path)) {
        output.outcome = Outcome::kept;
        output.reasons = {Reason::outputNotOpenable};
        return output;
    }
    output.reasons = {Reason::generated};
    std::ostringstream text;
    writeTuningText(text, tuning.blockId, area.blocks.at(static_cast<std::size_t>(tuning.blockId)));
    files.write(tuning.path, text.str());
    output.lines = tuningLines(text.str(), area, tuning.blockId);
    return output;
}

void explainAirplay(PlannedFiles& files, Explanation& outputs) {
    const Image image = readImage(); // before the tool's own functions, which would wait at a pipe
    AirplayValues values;
    readVehicleValues(values);
    values.audioProfile = readAudioProfile();
    for (const TuningOutput& tuning : TUNING_OUTPUTS) {
        outputs.push_back(asksForTuning(values.audioProfile)
                              ? generatedTuning(files, tuning)
                              : tuningNotAsked(tuning, values.audioProfile));
    }
    const std::vector<MergedValue<AirplayValues>> sources = {
        {[](AirplayValues& v) { v.model = otherText(v.model); }, modelOrigin(image)},
        {[](AirplayValues& v) { v.brand = otherText(v.brand); }, paramOrigin(image, BRAND_PARAM)},
        {[](AirplayValues& v) { v.audioProfile ^= 1; }, paramOrigin(image, AUDIO_PROFILE_PARAM)},
        {[](AirplayValues& v) { v.rightHandDrive ^= 1U; },
         paramOrigin(image, RIGHT_HAND_DRIVE_PARAM)},
    };
    PlannedMerge merge(files, AIRPLAY_FILE);
    outputs.push_back(merge.finish(values, sources, generateAirplayFile));
}

/// Requires that `iap2`, on whose output the next file depends, takes what is written to it.
void requireWritten(const PlannedMerge& iap2) {
    if (!iap2.output.fail() && !iap2.output.str().empty() &&
        PlannedFiles::isDevice(IAP2_FILE.output)) {
        throw kit::KitError(std::string(IAP2_FILE.output) + " is a device: only a run can tell " +
                            "whether it takes what is written, on which " + IAP1_FILE.output +
                            " depends");
    }
}

void explainIap(PlannedFiles& files, Explanation& outputs) {
    const Image image = readImage(); // these before the tool's own functions, as above
    const VersionFiles versions = readVersionFiles();
    std::vector<MergedValue<IapValues>> sources = {
        {[](IapValues& v) { v.model = otherText(v.model); }, modelOrigin(image)},
        {[](IapValues& v) { v.serial = otherText(v.serial); }, serialOrigin()},
        {[](IapValues& v) { v.firmwareVersion = otherText(v.firmwareVersion); },
         versionTextOrigin(versions)},
    };
    IapValues values;
    readIapValues(values);
    PlannedMerge device(files, IAP2_DEVICE_FILE);
    outputs.push_back(device.finish(values, sources, generateIap2DeviceFile));

    PlannedMerge iap2(files, IAP2_FILE);
    outputs.push_back(iap2.finish(values, sources, generateIap2File));

    requireWritten(iap2);
    switchToVersionDigits(values);
    sources.back().origin = versionDigitsOrigin(versions);
    PlannedMerge iap1(files, IAP1_FILE);
    iap1.dependsOn(iap2);
    outputs.push_back(
        iap1.finish(values, sources,
                    [&iap2](std::istream& templateFile, std::ostream& output, const IapValues& v) {
                        return generateIap1File(templateFile, output, iap2.output, v);
                    }));
    for (const VersionFile& file : versions.files) {
        requireUnwritten(outputs, file.path);
    }
}

} // namespace

Explanation explain(const kit::EnteredRoot& entered, const std::vector<std::string>& arguments) {
    const kit::LostPages lost;
    Explanation outputs;
    PlannedFiles files(entered.isRunningSystem());
    for (const Writer writer : writersOf(arguments)) {
        if (writer == updateAirplayConfigFile) {
            explainAirplay(files, outputs);
        } else if (writer == updateIapConfigFiles) {
            explainIap(files, outputs);
        } else {
            throw std::logic_error("error in orvane-unit: a writer that it can't explain");
        }
    }
    for (const char* input : {CONFIG_SHM_NAME, BOOT_DISK}) {
        requireUnwritten(outputs, input);
    }
    // Last, since a later output may be the same file by way of a link.
    for (Output& output : outputs) {
        output.kindAfter = files.look(output.path, output.contentAfter);
    }
    lost.requireNone(CONFIG_SHM_NAME);
    return outputs;
}

Explanation explainUnit(const std::filesystem::path& root,
                        const std::vector<std::string>& arguments) {
    const kit::EnteredRoot entered(root);
    return explain(entered, arguments);
}

} // namespace orvane::desk
