// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "writers/template_merge.h"

#include <iosfwd>
#include <string>

namespace orvane {

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

/// What the generated lines say about the vehicle and the unit. Each value is written up to its
/// first NUL byte.
struct IapValues {
    std::string serial;
    std::string model;
    std::string firmwareVersion; ///< a text in the two iAP2 files, six digits in the iAP1 file
};

/// Reads the values of the two iAP2 files.
void readIapValues(IapValues& values);

/// Turns them into the values of the iAP1 file, the only one with the six digits of the version.
void switchToVersionDigits(IapValues& values);

/// Write the generated lines and the template of a file to `output`, if that is the decision; else
/// nothing. `iap2Output` is the output of IAP2_FILE.
MergeDecision generateIap2DeviceFile(std::istream& templateFile, std::ostream& output,
                                     const IapValues& values);
MergeDecision generateIap2File(std::istream& templateFile, std::ostream& output,
                               const IapValues& values);
MergeDecision generateIap1File(std::istream& templateFile, std::ostream& output,
                               const std::ios& iap2Output, const IapValues& values);

/// Writes IAP2_DEVICE_FILE, IAP2_FILE and IAP1_FILE, in this order, each generated or replaced by
/// its stock file. A failed stage does not stop the next. Always returns 0.
int updateIapConfigFiles();

} // namespace orvane
