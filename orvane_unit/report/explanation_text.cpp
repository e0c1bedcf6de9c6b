// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/report/explanation_text.h"

#include "kit/description/value_key.h"
#include "kit/host/text.h"
#include "orvane_unit/explain/place.h"
#include "orvane_unit/explain/reasons.h"
#include "orvane_unit/report/names.h"
#include "orvane_unit/report/phrases.h"
#include "orvane_unit/report/place_text.h"
#include "orvane_unit/report/terminal.h"

#include <algorithm>
#include <cstddef>
#include <ostream>
#include <set>
#include <string>
#include <utility>
#include <variant>
#include <vector>

namespace orvane::desk {

namespace {

/// The greatest width of the column before the origins.
constexpr std::size_t WIDEST_LINE = 44;

Reason firstReason(const Line& line) {
    return line.origin.reasons.front();
}

bool isWholeFile(const Line& line) {
    return std::holds_alternative<FilePlace>(line.origin.place);
}

std::string lineText(const Line& line) {
    if (isWholeFile(line)) {
        const auto ends =
            static_cast<std::size_t>(std::count(line.text.begin(), line.text.end(), '\n'));
        const bool isOpen = !line.text.empty() && line.text.back() != '\n';
        return "... " + kit::counted(ends + (isOpen ? 1 : 0), "line") + ", " +
               kit::counted(line.text.size(), "byte");
    }
    if (line.text.empty()) {
        return LEFT_OUT;
    }
    return kit::printable(line.text.substr(0, line.text.size() - 1)); // without its line end
}

/// What is printed next to a line: the place of its value, and the codes of what is not as
/// intended. A code is explained only once; `said` holds those that were.
std::string originText(const Origin& origin, std::set<Reason>& said) {
    std::string text = placeText(origin);
    for (const Reason reason : origin.reasons) {
        const ReasonInfo& info = reasonInfo(reason);
        if (!info.isIntended) {
            text += (text.empty() ? "" : "; ") + std::string(info.code);
            text += said.insert(reason).second ? ": " + info.sentence : "";
        }
    }
    return kit::printable(text);
}

/// A line of the report: the text of one or more lines of the output, and their origin.
struct Row {
    std::string text;
    std::string origin;
    bool isIntended = true;
};

/// One row for the intended fields of a tuning block: up to 44 lines that all say the same.
Row tuningRow(const kit::ValueKey& key, std::size_t count) {
    return {"... " + kit::counted(count, "value"), holderText(key) + " of the boot disk", true};
}

/// The rows of all lines, or without orvane's own text and with one for all intended tuning fields.
std::vector<Row> rowsOf(const std::vector<Line>& lines, bool showsAll) {
    const auto isField = [](const Line& line) {
        return firstReason(line) == Reason::fromTuningBlock;
    };
    std::vector<Row> rows;
    const auto field = std::find_if(lines.begin(), lines.end(), isField);
    if (!showsAll && field != lines.end()) {
        const auto count = std::count_if(lines.begin(), lines.end(), isField);
        rows.push_back(tuningRow(field->origin.key, static_cast<std::size_t>(count)));
    }
    std::set<Reason> said;
    const Origin* before = nullptr;
    for (const Line& line : lines) {
        if (!showsAll && (firstReason(line) == Reason::fixedText || isField(line))) {
            continue;
        }
        const bool isGood = isIntended(line.origin.reasons);
        // The origin of lines that share one, such as those of a block of zeros, is printed once.
        const bool isRepeated = !isGood && before != nullptr && saysTheSame(*before, line.origin);
        rows.push_back({lineText(line), isRepeated ? "\"" : originText(line.origin, said), isGood});
        before = &line.origin;
    }
    return rows;
}

void printRows(std::ostream& out, const std::vector<Row>& rows) {
    std::size_t width = 0;
    for (const Row& row : rows) {
        width = std::max(width, row.text.size());
    }
    width = std::min(width, WIDEST_LINE);
    for (const Row& row : rows) {
        out << "  " << row.text;
        if (!row.origin.empty()) {
            out << std::string(width > row.text.size() ? width - row.text.size() : 0, ' ') << "  "
                << painted(row.isIntended ? Colour::faint : Colour::bad, row.origin);
        }
        out << '\n';
    }
}

} // namespace

void printExplanation(std::ostream& out, const Explanation& explanation, bool showsAll) {
    for (const Output& output : explanation) {
        const Colour colour = isIntended(output.reasons) ? Colour::good : Colour::bad;
        out << painted(Colour::place, output.path) << ": "
            << painted(colour, nameOf(output.outcome)) << '\n';
        for (const Reason reason : output.reasons) {
            if (reason != Reason::generated) {
                out << "  " << painted(colour, reasonInfo(reason).code) << ": "
                    << reasonInfo(reason).sentence << '\n';
            }
        }
        printRows(out, rowsOf(output.lines, showsAll));
    }
}

} // namespace orvane::desk
