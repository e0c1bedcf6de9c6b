// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace orvane::kit {

using Bytes = std::string; ///< raw bytes, not text

} // namespace orvane::kit
