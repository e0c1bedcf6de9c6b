// SPDX-License-Identifier: Apache-2.0
#pragma once

namespace orvane {

/// Writes /tmp/iap2_device.cfg, /tmp/iap2.cfg and /tmp/iap1.cfg, in this order, each generated or
/// replaced by its stock file. A stage that fails stops no later one. Always returns 0.
int updateIapConfigFiles();

} // namespace orvane
