// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/report/table.h"

namespace orvane::desk {

std::string padded(const std::string& text, std::size_t width) {
    return text.size() < width ? text + std::string(width - text.size(), ' ') : text;
}

} // namespace orvane::desk
