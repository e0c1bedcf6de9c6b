// SPDX-License-Identifier: Apache-2.0
//
// Every path of a unit that a run opens, for code that makes, copies or shows a unit.
#pragma once

#include "config/boot_disk.h"
#include "config/config_store.h"
#include "identity/software_version.h"
#include "tuning/audio_profile.h"
#include "writers/airplay_writer.h"
#include "writers/iap_writer.h"

namespace orvane {

/// The accessory files with their templates and stock files. The other outputs are TUNING_OUTPUTS.
constexpr AccessoryFile ACCESSORY_FILES[] = {AIRPLAY_FILE, IAP2_DEVICE_FILE, IAP2_FILE, IAP1_FILE};

/// The folder of all outputs.
constexpr char OUTPUT_FOLDER[] = "/tmp";

/// What is read for values: a memory object, a device, and a folder with its trailing slash.
constexpr const char* VALUE_SOURCES[] = {CONFIG_SHM_NAME, BOOT_DISK, VERSION_DIR};

} // namespace orvane
