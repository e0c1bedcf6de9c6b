// SPDX-License-Identifier: Apache-2.0
//
// Selection of the audio profile that the projection stack is to use.
#pragma once

#include <cstdint>

namespace orvane {

constexpr std::uint16_t AUDIO_PROFILE_PARAM = 134;
/// The profile that asks for tuning generated on the unit.
constexpr std::uint16_t AUDIO_PROFILE_GENERATED = 0xFFFF;
/// What getAudioProfile gives when the profile is unknown.
constexpr std::int32_t NO_AUDIO_PROFILE = -1;

constexpr char TELEPHONY_TUNING_FILE[] = "/tmp/telephony_FFFF.txt";
constexpr char SPEECHREC_TUNING_FILE[] = "/tmp/speechrec_FFFF.txt";

/// Reads AUDIO_PROFILE_PARAM, 0 to 65535, through its own handle, which is closed again on every
/// path. False, with `profile` as it was, when it can't be read, for whatever cause.
bool readAudioProfile(std::uint16_t& profile);

/// The value of AUDIO_PROFILE_PARAM, 0 to 65535 without any check, or NO_AUDIO_PROFILE when it
/// can't be read. For AUDIO_PROFILE_GENERATED it first writes the telephony and then the speech
/// recognition tuning file; whether they could be written does not matter to the result.
std::int32_t getAudioProfile();

} // namespace orvane
