// SPDX-License-Identifier: Apache-2.0
#include "tuning/audio_profile.h"

#include "config/config_store.h"
#include "config/param_access.h"
#include "tuning/dps_block.h"
#include "tuning/tuning_file.h"

namespace orvane {

namespace {

/// Writes one tuning file, or nothing when there is no memory even for its path.
void generate(std::int32_t blockId, const char* path) {
    try {
        generateTuningFile(blockId, path);
    } catch (...) { // NOLINT(bugprone-empty-catch)
        // The profile stands whether or not its files could be written, on purpose.
    }
}

} // namespace

bool readAudioProfile(std::uint16_t& profile) {
    ConfigStore store;
    store.init();
    // The getter of an open store fails for an unknown number or size only, and this one is known.
    // GCOVR_EXCL_BR_START
    const bool isRead =
        store.open() == 0 && getParamU16(store, AUDIO_PROFILE_PARAM, &profile) == PARAM_OK;
    // GCOVR_EXCL_BR_STOP
    store.close();
    return isRead;
}

std::int32_t getAudioProfile() {
    std::uint16_t profile = 0;
    if (!readAudioProfile(profile)) {
        return NO_AUDIO_PROFILE;
    }
    if (profile == AUDIO_PROFILE_GENERATED) {
        generate(DPS_BLOCK_TELEPHONY, TELEPHONY_TUNING_FILE);
        generate(DPS_BLOCK_SPEECHREC, SPEECHREC_TUNING_FILE);
    }
    return profile;
}

} // namespace orvane
