// SPDX-License-Identifier: Apache-2.0
#include "writers/iap_writer.h"

#include "identity/software_version.h"
#include "identity/vehicle_identity.h"

#include <fstream>

namespace orvane {

namespace {

/// The identity lines that open all three files. Values go out as C strings, on purpose: each ends
/// at its first NUL byte.
void writeAccessoryBlock(std::ostream& file, const IapValues& values) {
    file << "# This section is mandatory.  Populate all fields with accessory-specific info.\n";
    file << "[accessory]\n";
    file << "name=VOXA 3\n";
    file << "model=" << values.model.c_str() << "\n";
    file << "manufacturer=Marl Motor Company\n";
    file << "serial=" << values.serial.c_str() << "\n";
    file << "firmware_version=" << values.firmwareVersion.c_str() << "\n";
}

void writeIap2Head(std::ostream& file, const IapValues& values) {
    writeAccessoryBlock(file, values);
    file << "hardware_version=1.0.0\n\n";
}

void writeIap1Head(std::ostream& file, const IapValues& values) {
    writeAccessoryBlock(file, values);
    file << "hardware_version=010000\n";
    file << "rfcert=00000000 \n\n"; // the blank is there on purpose
}

MergeDecision generateIap2File(std::istream& templateFile, std::ostream& output,
                               const std::ios& /*iap2Output*/, const IapValues& values) {
    const MergeDecision decision = decideMerge(templateFile, output);
    if (decision == MergeDecision::generate) {
        writeIap2Head(output, values);
        copyBytes(templateFile, output);
    }
    return decision;
}

MergeDecision generateDeviceFile(std::istream& templateFile, std::ostream& output,
                                 const std::ios& iap2Output, const IapValues& values) {
    const MergeDecision decision = generateIap2File(templateFile, output, iap2Output, values);
    if (decision == MergeDecision::generate) {
        output << "\n[vehicle]\nenable=no\n\n";
    }
    return decision;
}

/// Tests the iAP2 output, then its own, and not its own template, on purpose. So a failed iAP2
/// output (not opened, not written whole, or its template empty) makes this file its stock file,
/// and a missing template leaves out the template's lines only.
MergeDecision generateIap1File(std::istream& templateFile, std::ostream& output,
                               const std::ios& iap2Output, const IapValues& values) {
    if (iap2Output.fail()) {
        return MergeDecision::iap2Failed;
    }
    if (output.fail()) {
        return MergeDecision::outputFailed;
    }
    writeIap1Head(output, values);
    copyBytes(templateFile, output);
    return MergeDecision::generate;
}

} // namespace

// iap1.cfg alone carries the six digits.
constexpr std::array<IapStage, IAP_STAGE_COUNT> IAP_STAGES = {{
    {IAP2_DEVICE_FILE, false, generateDeviceFile},
    {IAP2_FILE, false, generateIap2File},
    {IAP1_FILE, true, generateIap1File},
}};

void readIapValues(IapValues& values) {
    getUnitSerial(values.serial);
    getModelName(values.model);
    values.firmwareVersion = findApplicationVersion();
    // Read on every run and written nowhere, on purpose: none of the files carries a fuel type.
    std::string fuelType;
    getFuelType(fuelType);
}

void changeIapValues(const IapStage& stage, IapValues& values) {
    if (stage.hasVersionDigits) {
        values.firmwareVersion = softwareVersion();
    }
}

int updateIapConfigFiles() {
    IapValues values;
    readIapValues(values);

    // The streams of every stage live until the end, also those that a fallback leaves unwritten.
    std::array<TemplateMerge, IAP_STAGE_COUNT> merges;
    for (std::size_t i = 0; i < merges.size(); ++i) {
        const IapStage& stage = IAP_STAGES[i];
        changeIapValues(stage, values); // whatever became of the files before
        merges[i].open(stage.file);
        merges[i].finish(stage.file, stage.generate(merges[i].templateFile, merges[i].output,
                                                    merges[IAP2_STAGE].output, values));
    }
    return 0;
}

} // namespace orvane
