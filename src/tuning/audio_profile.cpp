// SPDX-License-Identifier: Apache-2.0
#include "tuning/audio_profile.h"

#include "config/config_store.h"
#include "config/param_access.h"
#include "tuning/tuning_file.h"

namespace orvane {

namespace {

/// Writes one tuning file, or nothing when there is no memory even for its path.
void generate(const TuningOutput& output) {
    try {
        generateTuningFile(output.blockId, output.path);
    } catch (...) { // NOLINT(bugprone-empty-catch)
        // The profile counts whether or not its files could be written, on purpose.
    }
}

} // namespace

std::int32_t readAudioProfile() {
    std::uint16_t profile = 0;
    ConfigStore store;
    store.init();
    store.open(); // if it fails, so does the getter
    const bool isRead = getParamU16(store, AUDIO_PROFILE_PARAM, &profile) == PARAM_OK;
    store.close();
    return isRead ? profile : NO_AUDIO_PROFILE;
}

bool asksForTuning(std::int32_t profile) {
    return profile == AUDIO_PROFILE_GENERATED;
}

std::int32_t getAudioProfile() {
    const std::int32_t profile = readAudioProfile();
    if (asksForTuning(profile)) {
        for (const TuningOutput& output : TUNING_OUTPUTS) {
            generate(output);
        }
    }
    return profile;
}

} // namespace orvane
