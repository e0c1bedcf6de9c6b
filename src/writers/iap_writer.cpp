// SPDX-License-Identifier: Apache-2.0
#include "writers/iap_writer.h"

#include "identity/software_version.h"
#include "identity/vehicle_identity.h"

#include <fstream>

namespace orvane {

namespace {

/// The identity lines that open all three files. Values are written as C strings, on purpose: each
/// ends at its first NUL byte.
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

/// The lines that both iAP2 files have.
MergeDecision generateIap2Lines(std::istream& templateFile, std::ostream& output,
                                const IapValues& values) {
    const MergeDecision decision = decideMerge(templateFile, output);
    if (decision == MergeDecision::generate) {
        writeIap2Head(output, values);
        copyBytes(templateFile, output);
    }
    return decision;
}

} // namespace

void readIapValues(IapValues& values) {
    getUnitSerial(values.serial);
    getModelName(values.model);
    values.firmwareVersion = findApplicationVersion();
    // Read on every run and written nowhere, on purpose: none of the files carries a fuel type.
    std::string fuelType;
    getFuelType(fuelType);
}

void switchToVersionDigits(IapValues& values) {
    values.firmwareVersion = softwareVersion();
}

MergeDecision generateIap2DeviceFile(std::istream& templateFile, std::ostream& output,
                                     const IapValues& values) {
    const MergeDecision decision = generateIap2Lines(templateFile, output, values);
    if (decision == MergeDecision::generate) {
        // A write that fails within the template leaves libc++'s buffer full, unnoticed, and the
        // next insertion would go past its end. A flush empties it, or the stream has failed.
        output.flush() << "\n[vehicle]\nenable=no\n\n";
    }
    return decision;
}

MergeDecision generateIap2File(std::istream& templateFile, std::ostream& output,
                               const IapValues& values) {
    return generateIap2Lines(templateFile, output, values);
}

// Tests the iAP2 output, then its own, but not its own template, on purpose. So a failed iAP2
// output (not opened, not written whole, or its template empty) makes this file its stock file, and
// a missing template leaves out the template's lines only.
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

int updateIapConfigFiles() {
    IapValues values;
    readIapValues(values);

    // The streams of every stage live until the end, even those that a fallback leaves unwritten.
    TemplateMerge device(IAP2_DEVICE_FILE);
    device.finish(generateIap2DeviceFile(device.templateFile, device.output, values));

    TemplateMerge iap2(IAP2_FILE);
    iap2.finish(generateIap2File(iap2.templateFile, iap2.output, values));

    // Whatever became of iap2.cfg.
    switchToVersionDigits(values);

    TemplateMerge iap1(IAP1_FILE);
    iap1.finish(generateIap1File(iap1.templateFile, iap1.output, iap2.output, values));
    return 0;
}

} // namespace orvane
