// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/report/run_text.h"

#include "kit/host/text.h"
#include "orvane_unit/report/unified_diff.h"

#include <map>
#include <optional>
#include <ostream>
#include <string>
#include <utility>

namespace orvane::desk {

void printTmpChanges(std::ostream& out, const TmpTree& before, const TmpTree& after, bool isBrief) {
    for (const auto& [name, content] : after.entries) {
        const std::string path = pathInTmp(name);
        const std::optional<std::string> old = before.file(name);
        if (!content || old == content) {
            continue;
        }
        if (isBrief) {
            out << (old ? "changed " : "made ") << kit::printable(path) << ", "
                << kit::counted(content->size(), "byte") << '\n';
        } else {
            printUnifiedDiff(out, path, old, content);
        }
    }
}

} // namespace orvane::desk
