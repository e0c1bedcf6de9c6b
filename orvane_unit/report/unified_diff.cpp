// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/report/unified_diff.h"

#include "kit/host/text.h"
#include "orvane_unit/compare/text_diff.h"
#include "orvane_unit/report/terminal.h"

#include <ostream>
#include <vector>

namespace orvane::desk {

namespace {

void printLine(std::ostream& out, const DiffLine& line) {
    const std::string text = printableLine(line.text);
    switch (line.kind) {
    case DiffLine::Kind::common:
        out << ' ' << text;
        break;
    case DiffLine::Kind::removed:
        out << painted(Colour::removed, "-" + text);
        break;
    case DiffLine::Kind::added:
        out << painted(Colour::added, "+" + text);
        break;
    }
    out << '\n';
    if (line.text.back() != '\n') {
        out << "\\ No newline at end of file\n";
    }
}

} // namespace

std::string printableLine(const std::string& line) {
    const bool hasEnd = !line.empty() && line.back() == '\n';
    return kit::printable(line.substr(0, line.size() - (hasEnd ? 1 : 0)));
}

void printUnifiedDiff(std::ostream& out, const std::string& name,
                      const std::optional<std::string>& before,
                      const std::optional<std::string>& after) {
    if (before == after) {
        return;
    }
    out << "--- " << (before ? kit::printable(name) : "/dev/null") << "\n+++ "
        << (after ? kit::printable(name) : "/dev/null") << '\n';
    for (const Hunk& hunk : differingHunks(before.value_or(""), after.value_or(""))) {
        out << painted(Colour::place, "@@ -" + std::to_string(hunk.before) + "," +
                                          std::to_string(hunk.beforeCount) + " +" +
                                          std::to_string(hunk.after) + "," +
                                          std::to_string(hunk.afterCount) + " @@")
            << '\n';
        for (const DiffLine& line : hunk.lines) {
            printLine(out, line);
        }
    }
}

} // namespace orvane::desk
