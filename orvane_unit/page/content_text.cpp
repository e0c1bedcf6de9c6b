// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/page/content_text.h"

#include "kit/host/text.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <map>
#include <type_traits>

namespace orvane::desk {

std::string contentText(const std::optional<kit::SparseContent>& content) {
    constexpr std::size_t MOST_BYTES = 32;
    if (!content) {
        return "can't be read";
    }
    if (content->empty()) {
        return "zeros";
    }
    std::uint64_t count = 0;
    for (const auto& [offset, bytes] : *content) {
        count +=
            bytes.size() - static_cast<std::size_t>(std::count(bytes.begin(), bytes.end(), '\0'));
    }
    const auto& [offset, bytes] = *content->begin();
    const bool isWhole = content->size() == 1 && bytes.size() <= MOST_BYTES;
    return kit::counted(count, "byte") + " not zero, the first at " + std::to_string(offset) +
           ": " + kit::hexText(bytes.substr(0, MOST_BYTES)) + (isWhole ? "" : " ...");
}

} // namespace orvane::desk
