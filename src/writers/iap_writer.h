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

/// What the generated lines say of the vehicle and the unit. Each value goes out up to its first
/// NUL byte.
struct IapValues {
    std::string serial;
    std::string model;
    std::string firmwareVersion; ///< a text in the two iAP2 files, six digits in the iAP1 file
};

/// Writes the generated head of IAP2_DEVICE_FILE and IAP2_FILE, and that of IAP1_FILE.
void writeIap2Head(std::ostream& file, const IapValues& values);
void writeIap1Head(std::ostream& file, const IapValues& values);

/// What follows the template in IAP2_DEVICE_FILE.
constexpr char IAP2_DEVICE_END[] = "\n[vehicle]\nenable=no\n\n";

/// Writes IAP2_DEVICE_FILE, IAP2_FILE and IAP1_FILE, in this order, each generated or replaced by
/// its stock file. A stage that fails stops no later one. Always returns 0.
int updateIapConfigFiles();

} // namespace orvane
