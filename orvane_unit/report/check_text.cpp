// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/report/check_text.h"

#include "kit/host/text.h"
#include "orvane_unit/explain/reasons.h"
#include "orvane_unit/report/table.h"
#include "orvane_unit/report/terminal.h"

#include <algorithm>
#include <cstddef>
#include <ostream>
#include <string>
#include <vector>

namespace orvane::desk {

namespace {

void printCase(std::ostream& out, const CaseResult& result, std::size_t width) {
    out << padded(result.name, width) << "  "
        << (result.isAsExpected() ? painted(Colour::good, "ok") : painted(Colour::bad, "differs"))
        << '\n';
    for (const std::vector<std::string>* lines : {&result.differences, &result.surprises}) {
        for (const std::string& line : *lines) {
            out << "    " << kit::printable(line) << '\n';
        }
    }
}

} // namespace

void printCheck(std::ostream& out, const CheckReport& report) {
    std::size_t width = 0;
    std::size_t failed = 0;
    for (const CaseResult& result : report.cases) {
        width = std::max(width, result.name.size());
        failed += result.isAsExpected() ? 0U : 1U;
    }
    for (const CaseResult& result : report.cases) {
        printCase(out, result, width);
    }
    out << kit::counted(report.cases.size(), "unit") << ", " << failed << " not as expected"
        << (report.isUpdate ? "; expectations updated" : "") << '\n'
        << "reasons reached: " << REASON_COUNT - report.unreached.size() << " of " << REASON_COUNT;
    const char* separator = "; not reached: ";
    for (const char* code : report.unreached) {
        out << separator << code;
        separator = ", ";
    }
    out << '\n';
}

} // namespace orvane::desk
