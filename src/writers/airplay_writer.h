// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tuning/audio_profile.h"
#include "writers/template_merge.h"

#include <cstdint>
#include <iosfwd>
#include <string>

namespace orvane {

constexpr AccessoryFile AIRPLAY_FILE = {
    "/tmp/airplay.conf",
    "/fs/mp/etc/airplay_static.conf",
    "/fs/mp/etc/airplay.conf",
};

/// What the generated head says about the vehicle.
struct AirplayValues {
    std::string model;
    std::string brand;
    unsigned int rightHandDrive = 0;
    std::int32_t audioProfile = NO_AUDIO_PROFILE; ///< NO_AUDIO_PROFILE leaves its lines out
};

/// Reads everything but the audio profile: getAudioProfile, which comes after it, writes files.
void readVehicleValues(AirplayValues& values);

/// Writes the generated head, which comes before the template.
void writeAirplayHead(std::ostream& file, const AirplayValues& values);

/// Writes the head and the template to `output`, if that is the decision; else nothing.
MergeDecision generateAirplayFile(std::istream& templateFile, std::ostream& output,
                                  const AirplayValues& values);

/// Writes AIRPLAY_FILE: a generated head, then the template; or the stock file. With a generated
/// audio profile the two tuning files come first (tuning/audio_profile.h). Always returns 0.
int updateAirplayConfigFile();

} // namespace orvane
