// SPDX-License-Identifier: Apache-2.0
#pragma once

namespace orvane::kit {

/// The built-in sample unit.
const char* sampleDescriptionText();

} // namespace orvane::kit
