// SPDX-License-Identifier: Apache-2.0
#pragma once

namespace orvane {

/// Writes /tmp/airplay.conf: a generated head, then the template; or the stock file. With a
/// generated audio profile the two tuning files come first (tuning/audio_profile.h). Always returns
/// 0.
int updateAirplayConfigFile();

} // namespace orvane
