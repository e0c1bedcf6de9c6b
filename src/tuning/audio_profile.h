// SPDX-License-Identifier: Apache-2.0
//
// Selection of the audio profile that the projection stack is to use.
#pragma once

#include "tuning/dps_block.h"

#include <cstdint>

namespace orvane {

constexpr std::uint16_t AUDIO_PROFILE_PARAM = 134;
/// The profile that asks for tuning generated on the unit.
constexpr std::uint16_t AUDIO_PROFILE_GENERATED = 0xFFFF;
/// What readAudioProfile gives when the profile is unknown.
constexpr std::int32_t NO_AUDIO_PROFILE = -1;

constexpr char TELEPHONY_TUNING_FILE[] = "/tmp/telephony_FFFF.txt";
constexpr char SPEECHREC_TUNING_FILE[] = "/tmp/speechrec_FFFF.txt";

/// A tuning block and the file that it becomes.
struct TuningOutput {
    std::int32_t blockId;
    const char* path;
};

/// In the order in which they are written.
constexpr TuningOutput TUNING_OUTPUTS[] = {
    {DPS_BLOCK_TELEPHONY, TELEPHONY_TUNING_FILE},
    {DPS_BLOCK_SPEECHREC, SPEECHREC_TUNING_FILE},
};

/// The value of AUDIO_PROFILE_PARAM, 0 to 65535 without any check, or NO_AUDIO_PROFILE when it
/// can't be read. Reads it through a handle of its own, which is closed on every path.
std::int32_t readAudioProfile();

/// Whether `profile`, as readAudioProfile gives it, asks for TUNING_OUTPUTS.
bool asksForTuning(std::int32_t profile);

/// readAudioProfile. Where the profile asks for them, it first writes TUNING_OUTPUTS; whether they
/// could be written does not affect the result.
std::int32_t getAudioProfile();

} // namespace orvane
