// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/page/impact_section.h"

#include "kit/description/value_key.h"
#include "kit/host/text.h"
#include "orvane_unit/page/wide_table.h"

#include <algorithm>
#include <cstddef>
#include <set>

namespace orvane::desk {

namespace {

/// The outputs that an input changes, in their order in a run.
std::vector<std::string> changedPaths(const std::vector<Impact>& impacts,
                                      const Explanation& explanation) {
    std::vector<std::string> paths;
    for (const Output& output : explanation) {
        const bool isNew = std::find(paths.begin(), paths.end(), output.path) == paths.end();
        const bool isChanged =
            std::any_of(impacts.begin(), impacts.end(), [&output](const Impact& impact) {
                return std::any_of(
                    impact.lines.begin(), impact.lines.end(),
                    [&output](const OutputLine& line) { return line.path == output.path; });
            });
        if (isNew && isChanged) {
            paths.push_back(output.path);
        }
    }
    return paths;
}

/// "lines 5, 7", or "all" of an output that becomes another one.
std::string linesText(const Impact& impact, const std::string& path) {
    std::string text;
    for (const OutputLine& line : impact.lines) {
        if (line.path == path) {
            text += (text.empty() ? "" : ", ") +
                    (line.number == 0 ? "all" : std::to_string(line.number));
        }
    }
    return text;
}

void addRow(Markup& page, const Impact& impact, const std::vector<std::string>& paths) {
    const Element row(page, "tr", {{"data-key", keyText(impact.key)}});
    page.add("th", keyText(impact.key));
    page.add("td", std::to_string(impact.changing) + " of " + std::to_string(impact.tried));
    for (const std::string& path : paths) {
        const std::string text = linesText(impact, path);
        page.add("td", {{"class", text.empty() ? "none" : "changed"}}, text);
    }
}

} // namespace

void addImpacts(Markup& page, const std::vector<Impact>& impacts, const Explanation& explanation,
                const std::string& id) {
    const Element section(page, "section", {{"class", "impacts"}, {"id", id + "-impacts"}});
    page.add("h3", "What changes which lines");
    const std::vector<std::string> paths = changedPaths(impacts, explanation);
    // A run with fewer options has fewer outputs than the impacts tell of.
    const auto isShown = [&paths](const Impact& impact) {
        return std::any_of(paths.begin(), paths.end(), [&impact](const std::string& path) {
            return !linesText(impact, path).empty();
        });
    };
    const auto shown =
        static_cast<std::size_t>(std::count_if(impacts.begin(), impacts.end(), isShown));
    page.add("p", "Each parameter, each byte of a slot that is read, and each tuning field was "
                  "changed in a copy of the unit. " +
                      kit::counted(shown, "input") + (shown == 1 ? " changes" : " change") +
                      " the lines below; " + std::to_string(impacts.size() - shown) +
                      (impacts.size() - shown == 1 ? " changes" : " change") + " nothing.");
    const WideTable table(page, "matrix");
    {
        const Element head(page, "thead");
        const Element row(page, "tr");
        page.add("th", "input");
        page.add("th", "values that change a line");
        for (const std::string& path : paths) {
            page.add("th", path);
        }
    }
    const Element body(page, "tbody");
    for (const Impact& impact : impacts) {
        if (isShown(impact)) {
            addRow(page, impact, paths);
        }
    }
}

} // namespace orvane::desk
