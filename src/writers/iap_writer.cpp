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

void writeDeviceFile(TemplateMerge& merge, const IapValues& values) {
    if (!merge.canGenerate()) {
        installStockFile(IAP2_DEVICE_FILE);
        return;
    }
    writeIap2Head(merge.output, values);
    merge.copyTemplate();
    merge.output << IAP2_DEVICE_END;
    merge.close();
}

void writeIap2File(TemplateMerge& merge, const IapValues& values) {
    if (!merge.canGenerate()) {
        installStockFile(IAP2_FILE);
        return;
    }
    writeIap2Head(merge.output, values);
    merge.copyTemplate();
    merge.close();
}

/// Tests the iAP2 output, then its own, and not its own template, on purpose. So a failed iAP2
/// output (not opened, not written whole, or its template empty) makes this file its stock file,
/// and a missing template leaves out the template's lines only.
void writeIap1File(TemplateMerge& merge, const std::ofstream& iap2Output, const IapValues& values) {
    if (iap2Output.fail() || merge.output.fail()) {
        installStockFile(IAP1_FILE);
        return;
    }
    writeIap1Head(merge.output, values);
    merge.copyTemplate();
    merge.close();
}

} // namespace

void writeIap2Head(std::ostream& file, const IapValues& values) {
    writeAccessoryBlock(file, values);
    file << "hardware_version=1.0.0\n\n";
}

void writeIap1Head(std::ostream& file, const IapValues& values) {
    writeAccessoryBlock(file, values);
    file << "hardware_version=010000\n";
    file << "rfcert=00000000 \n\n"; // the blank is there on purpose
}

int updateIapConfigFiles() {
    IapValues values;
    getUnitSerial(values.serial);
    getModelName(values.model);
    values.firmwareVersion = findApplicationVersion();
    // Read on every run and written nowhere, on purpose: none of the files carries a fuel type.
    std::string fuelType;
    getFuelType(fuelType);

    // The streams of every stage live until the end, also those that a fallback leaves unwritten.
    TemplateMerge device(IAP2_DEVICE_FILE);
    writeDeviceFile(device, values);

    TemplateMerge iap2(IAP2_FILE);
    writeIap2File(iap2, values);

    // iap1.cfg alone carries the six-digit form. The switch comes whatever became of iap2.cfg.
    values.firmwareVersion = softwareVersion();

    TemplateMerge iap1(IAP1_FILE);
    writeIap1File(iap1, iap2.output, values);
    return 0;
}

} // namespace orvane
