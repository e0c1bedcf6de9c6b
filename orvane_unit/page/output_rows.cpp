// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/page/output_rows.h"

#include "orvane_unit/page/room.h"
#include "orvane_unit/report/place_text.h"

#include <algorithm>
#include <utility>

namespace orvane::desk {

bool OutputRows::next(OutputRow& row) {
    if (index_ == lines_.size()) {
        return false;
    }
    const Line& line = lines_[index_];
    const std::size_t end = std::min(line.text.find('\n', at_), line.text.size());
    const bool hasEnd = end < line.text.size();
    row = {number_, std::string_view(line.text).substr(at_, end - at_), hasEnd, line.text.empty(),
           &line.origin};
    number_ += hasEnd ? 1 : 0;
    at_ = end + (hasEnd ? 1 : 0);
    if (at_ == line.text.size()) {
        at_ = 0;
        ++index_;
    }
    return true;
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
    return text + (text.empty() || place.empty() ? "" : ": ") + briefly(place);
}

} // namespace orvane::desk
