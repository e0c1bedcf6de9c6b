// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/explain/explanation.h"

#include <algorithm>

namespace orvane::desk {

Origin fixedText() {
    return {{Reason::fixedText}, {}, {}};
}

bool isIntended(const std::vector<Reason>& reasons) {
    return std::all_of(reasons.begin(), reasons.end(),
                       [](Reason reason) { return reasonInfo(reason).isIntended; });
}

bool isIntended(const Output& output) {
    return isIntended(output.reasons) &&
           std::all_of(output.lines.begin(), output.lines.end(),
                       [](const Line& line) { return isIntended(line.origin.reasons); });
}

bool isIntended(const Explanation& explanation) {
    return std::all_of(explanation.begin(), explanation.end(),
                       [](const Output& output) { return isIntended(output); });
}

} // namespace orvane::desk
