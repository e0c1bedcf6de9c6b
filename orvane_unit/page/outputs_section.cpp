// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/page/outputs_section.h"

#include "kit/description/value_key.h"
#include "kit/host/text.h"
#include "orvane_unit/explain/reasons.h"
#include "orvane_unit/page/output_rows.h"
#include "orvane_unit/page/room.h"
#include "orvane_unit/page/table_titles.h"
#include "orvane_unit/page/unit_id.h"
#include "orvane_unit/page/wide_table.h"
#include "orvane_unit/report/names.h"
#include "orvane_unit/report/phrases.h"

#include <cstddef>
#include <optional>
#include <set>
#include <variant>
#include <vector>

namespace orvane::desk {

namespace {

/// Codes with blanks between them.
std::string codesText(const std::vector<Reason>& reasons) {
    std::string text;
    for (const Reason reason : reasons) {
        text += (text.empty() ? "" : " ") + std::string(reasonInfo(reason).code);
    }
    return text;
}

/// The cells of a line: its number and its text.
void addLine(Markup& page, const OutputRow& row, Room& room) {
    page.add("th", row.isLeftOut ? "-" : std::to_string(row.number));
    const Element cell(page, "td");
    if (row.isLeftOut) {
        page.add("small", {{"class", "sign"}}, LEFT_OUT);
        return;
    }
    addCode(page, row.text, room);
    if (!row.hasEnd) {
        page.add("small", {{"class", "sign"}}, "(no line end)");
    }
}

/// Says how much of an output is not shown, if anything.
void addMore(Markup& page, OutputRows& rows) {
    std::size_t lines = 0;
    std::size_t bytes = 0;
    for (OutputRow row; rows.next(row); ++lines) {
        bytes += row.size();
    }
    if (lines == 0) {
        return;
    }
    const Element more(page, "p", {{"class", "more"}});
    page.addText(kit::counted(lines, "more line") + " (" + kit::counted(bytes, "byte") + "): see ");
    page.add("code", "orvane-unit explain --json --content");
}

void addRows(Markup& page, OutputRows& rows, Room& room) {
    const WideTable table(page, "lines");
    addTitles(page, {"line", "text", "origin"});
    std::optional<Element> body; // of neighbours with the same reasons, which are given once
    const std::vector<Reason>* common = nullptr;
    std::set<Reason> said;
    for (OutputRow row; !room.isUsedUp() && rows.next(row);) {
        if (common == nullptr || *common != row.origin->reasons) {
            common = &row.origin->reasons;
            body.emplace(page, "tbody", Attributes{{"data-reasons", codesText(*common)}});
        }
        const Element line(page, "tr",
                           {{"class", isIntended(*common) ? "" : "fallback"},
                            {"data-key", keyText(row.origin->key)}});
        addLine(page, row, room);
        page.add("td", originText(*row.origin, said));
    }
}

void addLines(Markup& page, const std::vector<Line>& lines) {
    OutputRows rows(lines);
    Room room;
    addRows(page, rows, room);
    addMore(page, rows);
}

/// Adds what is there, whatever it comes from.
void addContent(Markup& page, const std::string& content) {
    const std::vector<Line> lines = {{content, {}}};
    OutputRows rows(lines);
    Room room;
    {
        const WideTable table(page, "lines left");
        addTitles(page, {"line", "text"});
        const Element body(page, "tbody");
        for (OutputRow row; !room.isUsedUp() && rows.next(row);) {
            const Element line(page, "tr");
            addLine(page, row, room);
        }
    }
    addMore(page, rows);
}

/// What is at the output's path after the run, if the output's own lines don't say it.
void addWhatIsLeft(Markup& page, const Output& output) {
    std::string written;
    for (const Line& line : output.lines) {
        written += line.text;
    }
    if (output.kindAfter != PathKind::file) {
        const std::string what = output.kindAfter == PathKind::nothing
                                     ? "nothing"
                                     : std::string("a ") + wordOf(output.kindAfter);
        page.add("p", {{"class", "left"}}, "After the run, " + what + " is there.");
        return;
    }
    if (written == output.contentAfter && !written.empty()) {
        return;
    }
    page.add("p", {{"class", "left"}},
             output.contentAfter.empty()
                 ? "After the run, an empty file is there."
                 : "After the run, a file is there that this output did not write:");
    if (!output.contentAfter.empty()) {
        addContent(page, output.contentAfter);
    }
}

} // namespace

void addOutputs(Markup& page, const Explanation& explanation, const std::string& id) {
    const Element section(page, "section", {{"class", "outputs"}, {"id", id + "-outputs"}});
    page.add("h3", "Outputs");
    for (std::size_t i = 0; i < explanation.size(); ++i) {
        const Output& output = explanation[i];
        const std::string outcome = nameOf(output.outcome);
        const Element whole(page, "section",
                            {{"class", "output state-" + outcome},
                             {"id", outputId(id, i)},
                             {"data-path", output.path}});
        page.add("h4", output.path);
        page.add("p", {{"class", "state"}}, outcome);
        if (!output.lines.empty()) {
            addLines(page, output.lines);
        }
        addWhatIsLeft(page, output);
    }
}

} // namespace orvane::desk
