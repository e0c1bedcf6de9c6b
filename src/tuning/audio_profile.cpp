// SPDX-License-Identifier: Apache-2.0
#include "tuning/audio_profile.h"

#include "config/config_store.h"
#include "config/param_access.h"
#include "tuning/dps_block.h"
#include "tuning/tuning_file.h"

namespace orvane {

namespace {

/// Reads the parameter through its own handle, which is closed again on every path. False when it
/// can't be read, for whatever cause.
bool readAudioProfile(std::uint16_t& profile) {
    ConfigStore store;
    store.init();
    const bool isRead =
        store.open() == 0 && getParamU16(store, AUDIO_PROFILE_PARAM, &profile) == PARAM_OK;
    store.close();
    return isRead;
}

} // namespace

std::int32_t getAudioProfile() {
    std::uint16_t profile = 0;
    if (!readAudioProfile(profile)) {
        return NO_AUDIO_PROFILE;
    }
    if (profile == AUDIO_PROFILE_GENERATED) {
        generateTuningFile(DPS_BLOCK_TELEPHONY, TELEPHONY_TUNING_FILE);
        generateTuningFile(DPS_BLOCK_SPEECHREC, SPEECHREC_TUNING_FILE);
    }
    return profile;
}

} // namespace orvane
