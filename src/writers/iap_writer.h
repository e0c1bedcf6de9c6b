// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "writers/template_merge.h"

#include <array>
#include <cstddef>
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

/// One of the three files on its way.
struct IapStage {
    AccessoryFile file;

    /// Whether the values carry the six digits of the version from this stage on.
    bool hasVersionDigits;

    /// Writes the generated lines and the template to `output`, if that is the decision; else
    /// nothing. `iap2Output` is the output of IAP2_FILE.
    MergeDecision (*generate)(std::istream& templateFile, std::ostream& output,
                              const std::ios& iap2Output, const IapValues& values);
};

constexpr std::size_t IAP_STAGE_COUNT = 3;
/// The place of IAP2_FILE among the stages.
constexpr std::size_t IAP2_STAGE = 1;

/// The stages in their order.
extern const std::array<IapStage, IAP_STAGE_COUNT> IAP_STAGES;

/// Reads the values of the first stage.
void readIapValues(IapValues& values);

/// Makes the values of `stage` out of those of the stage before.
void changeIapValues(const IapStage& stage, IapValues& values);

/// Takes IAP_STAGES in their order: opens each file, and generates it or puts its stock file in its
/// place. A stage that fails stops no later one. Always returns 0.
int updateIapConfigFiles();

} // namespace orvane
