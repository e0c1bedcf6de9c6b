// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/report/explanation_text.h"

#include "kit/host/text.h"
#include "orvane_unit/explain/reasons.h"
#include "orvane_unit/report/terminal.h"

#include <algorithm>
#include <cstddef>
#include <iterator>
#include <ostream>
#include <set>
#include <string>
#include <utility>
#include <vector>

namespace orvane::desk {

namespace {

/// Where the column of origins begins, at most.
constexpr std::size_t WIDEST_LINE = 44;

bool isBlock(const Line& line) {
    return line.reasons.front() == Reason::fromTemplate ||
           line.reasons.front() == Reason::fromStock;
}

std::string lineText(const Line& line) {
    if (isBlock(line)) {
        const auto ends =
            static_cast<std::size_t>(std::count(line.text.begin(), line.text.end(), '\n'));
        const bool isOpen = !line.text.empty() && line.text.back() != '\n';
        return "... " + kit::counted(ends + (isOpen ? 1 : 0), "line") + ", " +
               kit::counted(line.text.size(), "byte");
    }
    if (line.text.empty()) {
        return "(left out)";
    }
    return kit::printable(line.text.substr(0, line.text.size() - 1)); // without its line end
}

/// A line's origin: the value's place, and a code where it is not as intended. What the code means
/// is said once, and kept in `said`.
std::string originText(const Line& line, std::set<Reason>& said) {
    std::string text = line.detail;
    for (const Reason reason : line.reasons) {
        const ReasonInfo& info = reasonInfo(reason);
        if (!info.isIntended) {
            text += (text.empty() ? "" : "; ") + std::string(info.code);
            text += said.insert(reason).second ? std::string(": ") + info.sentence : "";
        }
    }
    return kit::printable(text);
}

/// Lines that say the same of themselves, such as a block of zeros, need saying it once.
bool repeats(const Line& line, const Line& before) {
    return line.reasons == before.reasons && line.detail == before.detail &&
           !isIntended(line.reasons);
}

/// Stands for the lines of a tuning block that are as they should be: 44 lines that all say the
/// same.
Line tuningSummary(const std::vector<Line>& lines) {
    const auto isField = [](const Line& line) {
        return line.reasons.front() == Reason::fromTuningBlock;
    };
    const auto first = std::find_if(lines.begin(), lines.end(), isField);
    if (first == lines.end()) {
        return {"", {Reason::fixedText}, "", ""};
    }
    const auto count = static_cast<std::size_t>(std::count_if(lines.begin(), lines.end(), isField));
    const std::string block = first->key.substr(0, first->key.rfind('.'));
    return {"... " + kit::counted(count, "value") + "\n", first->reasons, block,
            first->detail.substr(0, first->detail.find(',')) + " of the boot disk"};
}

/// The lines to print: all, or those that have more to say than most.
std::vector<Line> chosenLines(const std::vector<Line>& lines, bool showsAll) {
    if (showsAll) {
        return lines;
    }
    std::vector<Line> chosen;
    const Line summary = tuningSummary(lines);
    if (summary.reasons.front() == Reason::fromTuningBlock) {
        chosen.push_back(summary);
    }
    std::copy_if(lines.begin(), lines.end(), std::back_inserter(chosen), [](const Line& line) {
        return line.reasons.front() != Reason::fixedText &&
               line.reasons.front() != Reason::fromTuningBlock;
    });
    return chosen;
}

void printLines(std::ostream& out, const std::vector<Line>& lines) {
    std::size_t width = 0;
    for (const Line& line : lines) {
        width = std::max(width, lineText(line).size());
    }
    width = std::min(width, WIDEST_LINE);
    const Line* before = nullptr;
    std::set<Reason> said;
    for (const Line& line : lines) {
        const std::string text = lineText(line);
        const std::string origin =
            before != nullptr && repeats(line, *before) ? "\"" : originText(line, said);
        out << "  " << text;
        if (!origin.empty()) {
            out << std::string(width > text.size() ? width - text.size() : 0, ' ') << "  "
                << painted(isIntended(line.reasons) ? Colour::faint : Colour::bad, origin);
        }
        out << '\n';
        before = &line;
    }
}

} // namespace

void printExplanation(std::ostream& out, const Explanation& explanation, bool showsAll) {
    for (const Output& output : explanation) {
        const Colour colour = isIntended(output.reasons) ? Colour::good : Colour::bad;
        out << painted(Colour::place, output.path) << ": "
            << painted(colour, outcomeName(output.outcome)) << '\n';
        for (const Reason reason : output.reasons) {
            if (reason != Reason::generated) {
                out << "  " << painted(colour, reasonInfo(reason).code) << ": "
                    << reasonInfo(reason).sentence << '\n';
            }
        }
        printLines(out, chosenLines(output.lines, showsAll));
    }
}

} // namespace orvane::desk
