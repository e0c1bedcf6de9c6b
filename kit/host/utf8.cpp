// SPDX-License-Identifier: Apache-2.0
#include "kit/host/utf8.h"

#include <utf8.h>

namespace orvane::kit {

bool isUtf8(std::string_view text) {
    return utf8::is_valid(text.begin(), text.end());
}

} // namespace orvane::kit
