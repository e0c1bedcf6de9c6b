// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/page/bar_plot.h"

#include <algorithm>
#include <string>

namespace orvane::desk {

namespace {

constexpr std::int32_t HEIGHT = 24;
constexpr std::int32_t BAR = 5;
constexpr std::int32_t STEP = 7;

/// The values that a plot must have room for, zero among them.
struct Scale {
    std::int32_t least = 0;
    std::int32_t greatest = 0;

    std::int32_t y(std::int32_t value) const {
        const std::int32_t range = std::max(greatest - least, 1);
        return (greatest - value) * HEIGHT / range;
    }
};

Scale scaleOf(const std::vector<std::vector<std::int32_t>>& lists) {
    Scale scale;
    for (const std::vector<std::int32_t>& list : lists) {
        for (const std::int32_t value : list) {
            scale.least = std::min(scale.least, value);
            scale.greatest = std::max(scale.greatest, value);
        }
    }
    return scale;
}

/// A bar from zero to `value`, at least so high that it can be seen.
std::string barPath(std::size_t at, std::int32_t value, const Scale& scale) {
    const std::int32_t zero = scale.y(0);
    const std::int32_t height = scale.y(value) - zero;
    return "M" + std::to_string(at * STEP) + " " + std::to_string(zero) + "h" +
           std::to_string(BAR) + "v" + std::to_string(height == 0 ? 1 : height) + "h-" +
           std::to_string(BAR) + "z";
}

} // namespace

void drawBars(Markup& page, const std::vector<std::vector<std::int32_t>>& lists,
              std::size_t index) {
    const std::vector<std::int32_t>& list = lists[index];
    const Scale scale = scaleOf(lists);
    std::string same;
    std::string differing;
    for (std::size_t at = 0; at < list.size(); ++at) {
        const bool isSame = std::all_of(lists.begin(), lists.end(), [&list, at](const auto& other) {
            return other[at] == list[at];
        });
        (isSame ? same : differing) += barPath(at, list[at], scale);
    }
    const std::string width = std::to_string(list.size() * STEP);
    const Element plot(page, "svg",
                       {{"class", "bars"},
                        {"aria-hidden", "true"}, // the numbers beside it say the same
                        {"width", width},
                        {"height", std::to_string(HEIGHT + 1)},
                        {"viewBox", "0 0 " + width + " " + std::to_string(HEIGHT + 1)}});
    if (!same.empty()) {
        page.addShape("path", {{"class", "bar"}, {"d", same}});
    }
    if (!differing.empty()) {
        page.addShape("path", {{"class", "bar differs"}, {"d", differing}});
    }
}

} // namespace orvane::desk
