// SPDX-License-Identifier: Apache-2.0
#include "unit/text_diff.h"

#include "unit/terminal.h"

#include <dtl/dtl.hpp>

#include <algorithm>
#include <ostream>

namespace orvane::unit {

namespace {

std::vector<std::string> linesOf(const std::string& text) {
    std::vector<std::string> lines;
    for (std::size_t begin = 0; begin < text.size();) {
        const std::size_t end = std::min(text.find('\n', begin), text.size() - 1) + 1;
        lines.push_back(text.substr(begin, end - begin));
        begin = end;
    }
    return lines;
}

DiffLine::Kind kindOf(dtl::edit_t edit) {
    return edit == dtl::SES_ADD      ? DiffLine::Kind::added
           : edit == dtl::SES_DELETE ? DiffLine::Kind::removed
                                     : DiffLine::Kind::common;
}

std::size_t number(long long value) {
    return static_cast<std::size_t>(value);
}

void printLine(std::ostream& out, const DiffLine& line) {
    const std::string text = lineForEyes(line.text);
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

std::vector<Hunk> differingHunks(const std::string& before, const std::string& after) {
    if (before == after) {
        return {};
    }
    dtl::Diff<std::string> diff(linesOf(before), linesOf(after));
    diff.onHuge();
    diff.compose();
    diff.composeUnifiedHunks();
    std::vector<Hunk> hunks;
    for (const auto& found : diff.getUniHunks()) {
        Hunk hunk{number(found.a), number(found.b), number(found.c), number(found.d), {}};
        for (const auto* part : {&found.common[0], &found.change, &found.common[1]}) {
            for (const auto& [text, info] : *part) {
                const DiffLine::Kind kind = kindOf(info.type);
                hunk.lines.push_back({kind, text,
                                      kind == DiffLine::Kind::added ? 0 : number(info.beforeIdx),
                                      kind == DiffLine::Kind::removed ? 0 : number(info.afterIdx)});
            }
        }
        hunks.push_back(std::move(hunk));
    }
    return hunks;
}

std::string lineForEyes(const std::string& line) {
    const bool hasEnd = !line.empty() && line.back() == '\n';
    return printable(line.substr(0, line.size() - (hasEnd ? 1 : 0)));
}

void printUnifiedDiff(std::ostream& out, const std::string& name,
                      const std::optional<std::string>& before,
                      const std::optional<std::string>& after) {
    if (before == after) {
        return;
    }
    out << "--- " << (before ? printable(name) : "/dev/null") << "\n+++ "
        << (after ? printable(name) : "/dev/null") << '\n';
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

} // namespace orvane::unit
