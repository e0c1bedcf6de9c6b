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

/// What has become of a case.
std::string verdictOf(const CaseResult& result) {
    switch (result.update) {
    case CaseUpdate::done:
        return painted(Colour::good, "updated");
    case CaseUpdate::needless:
        return painted(Colour::good, "unchanged");
    case CaseUpdate::refused:
        return painted(Colour::bad, "not updated");
    case CaseUpdate::none:
        break;
    }
    return result.isAsExpected()  ? painted(Colour::good, "ok")
           : result.fault.empty() ? painted(Colour::bad, "differs")
                                  : painted(Colour::bad, "not checked");
}

void printCase(std::ostream& out, const CaseResult& result, std::size_t width) {
    out << padded(kit::printable(result.name), width) << "  " << verdictOf(result) << '\n';
    for (const std::vector<std::string>* lines : {&result.differences, &result.surprises}) {
        for (const std::string& line : *lines) {
            out << "    " << kit::printable(line) << '\n';
        }
    }
}

std::size_t countOf(const CheckReport& report, CaseUpdate update) {
    return static_cast<std::size_t>(
        std::count_if(report.cases.begin(), report.cases.end(),
                      [update](const CaseResult& result) { return result.update == update; }));
}

void printCounts(std::ostream& out, const CheckReport& report) {
    out << kit::counted(report.cases.size(), "unit") << ", ";
    if (report.isUpdate) {
        out << countOf(report, CaseUpdate::done) << " updated, "
            << countOf(report, CaseUpdate::needless) << " unchanged, "
            << countOf(report, CaseUpdate::refused) << " not updated\n";
    } else {
        out << std::count_if(report.cases.begin(), report.cases.end(),
                             [](const CaseResult& result) { return !result.isAsExpected(); })
            << " not as expected\n";
    }
}

} // namespace

void printCheck(std::ostream& out, const CheckReport& report) {
    std::size_t width = 0;
    for (const CaseResult& result : report.cases) {
        width = std::max(width, kit::printable(result.name).size());
    }
    for (const CaseResult& result : report.cases) {
        printCase(out, result, width);
    }
    printCounts(out, report);
    out << "reasons reached: " << REASON_COUNT - report.unreached.size() << " of " << REASON_COUNT;
    const char* separator = "; not reached: ";
    for (const char* code : report.unreached) {
        out << separator << code;
        separator = ", ";
    }
    out << '\n';
}

} // namespace orvane::desk
