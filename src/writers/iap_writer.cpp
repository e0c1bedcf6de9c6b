// SPDX-License-Identifier: Apache-2.0
#include "writers/iap_writer.h"

#include "identity/software_version.h"
#include "identity/vehicle_identity.h"
#include "writers/template_merge.h"

#include <fstream>
#include <ostream>
#include <string>

namespace orvane {

namespace {

constexpr AccessoryFile IAP2_DEVICE_FILE = {
    "/tmp/iap2_device.cfg",
    "/fs/mp/etc/iap2_device_static.cfg",
    "/fs/mp/etc/iap2_device.cfg",
};

constexpr AccessoryFile IAP2_FILE = {
    "/tmp/iap2.cfg",
    "/fs/mp/etc/mm/iap2_static.cfg",
    "/fs/mp/etc/mm/iap2.cfg",
};

constexpr AccessoryFile IAP1_FILE = {
    "/tmp/iap1.cfg",
    "/fs/mp/etc/mm/iap1_static.cfg",
    "/fs/mp/etc/mm/iap1.cfg",
};

constexpr char IAP2_HARDWARE[] = "hardware_version=1.0.0\n\n";

struct IapValues {
    std::string serial;
    std::string model;
    std::string firmwareVersion;
};

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
    writeAccessoryBlock(merge.output, values);
    merge.output << IAP2_HARDWARE;
    merge.copyTemplate();
    merge.output << "\n[vehicle]\nenable=no\n\n";
    merge.close();
}

void writeIap2File(TemplateMerge& merge, const IapValues& values) {
    if (!merge.canGenerate()) {
        installStockFile(IAP2_FILE);
        return;
    }
    writeAccessoryBlock(merge.output, values);
    merge.output << IAP2_HARDWARE;
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
    writeAccessoryBlock(merge.output, values);
    merge.output << "hardware_version=010000\n";
    merge.output << "rfcert=00000000 \n\n"; // the blank is there on purpose
    merge.copyTemplate();
    merge.close();
}

} // namespace

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
