// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string_view>

namespace orvane::kit {

/// Whether `text` is well-formed UTF-8: shortest forms only, no surrogates, nothing above U+10FFFF.
bool isUtf8(std::string_view text);

} // namespace orvane::kit
