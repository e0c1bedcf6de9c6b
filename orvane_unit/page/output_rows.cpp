// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/page/output_rows.h"

#include "orvane_unit/report/place_text.h"

#include <utility>

namespace orvane::desk {

std::vector<OutputRow> outputRows(const std::vector<Line>& lines) {
    std::vector<OutputRow> rows;
    std::size_t number = 1;
    for (const Line& line : lines) {
        if (line.text.empty()) {
            rows.push_back({number, "", false, true, &line.origin});
        }
        for (std::size_t at = 0; at < line.text.size();) {
            const std::size_t end = line.text.find('\n', at);
            const bool hasEnd = end != std::string::npos;
            rows.push_back({number, line.text.substr(at, end - at), hasEnd, false, &line.origin});
            number += hasEnd ? 1 : 0;
            at = hasEnd ? end + 1 : line.text.size();
        }
    }
    return rows;
}

std::string originText(const Origin& origin, std::set<Reason>& said) {
    const std::string place = placeText(origin);
    std::string text;
    for (const Reason reason : origin.reasons) {
        const bool isNew = said.insert(reason).second;
        if (isNew || place.empty() || !reasonInfo(reason).isIntended) {
            text += (text.empty() ? "" : "; ") + reasonInfo(reason).sentence;
        }
    }
    return text + (text.empty() || place.empty() ? "" : ": ") + place;
}

} // namespace orvane::desk
