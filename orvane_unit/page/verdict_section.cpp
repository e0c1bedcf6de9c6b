// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/page/verdict_section.h"

#include "kit/description/value_key.h"
#include "kit/host/text.h"
#include "orvane_unit/explain/reasons.h"
#include "orvane_unit/page/output_rows.h"
#include "orvane_unit/page/room.h"
#include "orvane_unit/page/unit_id.h"
#include "orvane_unit/report/names.h"
#include "orvane_unit/report/place_text.h"

#include <algorithm>
#include <cstddef>
#include <vector>

namespace orvane::desk {

namespace {

void addReason(Markup& page, Reason reason) {
    page.addText(reasonInfo(reason).sentence);
    page.addText(" ");
    page.add("code", {{"class", "code"}}, reasonInfo(reason).code);
}

/// Lines, one after the other or not, that are not as intended for one and the same cause.
struct Trouble {
    const Origin* origin = nullptr;
    bool isLeftOut = false;
    std::size_t first = 0; ///< number of the first line, if it is not left out
    std::size_t count = 0;
};

std::string linesOf(const Trouble& trouble) {
    if (trouble.isLeftOut) {
        return "left out: ";
    }
    const std::string first = "line " + std::to_string(trouble.first);
    return trouble.count == 1
               ? first + ": "
               : kit::counted(trouble.count, "line") + ", the first is " + first + ": ";
}

std::vector<Trouble> troublesOf(const Output& output) {
    std::vector<Trouble> troubles;
    OutputRows rows(output.lines);
    for (OutputRow row; rows.next(row);) {
        if (isIntended(row.origin->reasons)) {
            continue;
        }
        const auto same =
            std::find_if(troubles.begin(), troubles.end(), [&row](const Trouble& other) {
                return other.isLeftOut == row.isLeftOut && saysTheSame(*other.origin, *row.origin);
            });
        if (same == troubles.end()) {
            troubles.push_back({row.origin, row.isLeftOut, row.number, 1});
        } else {
            ++same->count;
        }
    }
    return troubles;
}

void addTrouble(Markup& page, const Trouble& trouble) {
    const Element item(page, "li",
                       {{"class", "trouble"}, {"data-key", keyText(trouble.origin->key)}});
    page.addText(linesOf(trouble));
    for (const Reason reason : trouble.origin->reasons) {
        addReason(page, reason);
        page.addText("; ");
    }
    page.addText("look at ");
    page.add("code", keyText(trouble.origin->key));
    const std::string place = placeText(*trouble.origin);
    if (!place.empty()) {
        page.addText(" (" + briefly(place) + ")");
    }
}

/// Why the output is what it is, and the values that decided it if that was not intended.
void addOutcomeReasons(Markup& page, const Output& output) {
    for (const Reason reason : output.reasons) {
        const Element item(page, "li", {{"class", "reason"}});
        addReason(page, reason);
    }
    if (isIntended(output.reasons)) {
        return;
    }
    for (const kit::ValueKey& key : output.keys) {
        const Element item(page, "li", {{"class", "look"}, {"data-key", keyText(key)}});
        page.addText("look at ");
        page.add("code", keyText(key));
    }
}

void addTile(Markup& page, const Output& output, const std::string& outputId) {
    const bool isGood = isIntended(output);
    const std::string outcome = nameOf(output.outcome);
    const Element tile(page, "li",
                       {{"class", "tile state-" + outcome + (isGood ? "" : " fallback")}});
    page.add("a", {{"href", "#" + outputId}}, output.path);
    page.add("strong", {{"class", "state"}}, outcome);
    page.add("span", {{"class", "sign"}}, isGood ? "as intended" : "not as intended");
    const Element list(page, "ul", {{"class", "reasons"}});
    addOutcomeReasons(page, output);
    for (const Trouble& trouble : troublesOf(output)) {
        addTrouble(page, trouble);
    }
}

std::string summaryOf(const Explanation& explanation) {
    const auto good = static_cast<std::size_t>(
        std::count_if(explanation.begin(), explanation.end(),
                      [](const Output& output) { return isIntended(output); }));
    const std::size_t bad = explanation.size() - good;
    return bad == 0 ? "All outputs are as intended."
                    : std::to_string(bad) + " of " + kit::counted(explanation.size(), "output") +
                          (bad == 1 ? " is" : " are") + " not as intended.";
}

} // namespace

void addVerdict(Markup& page, const Explanation& explanation, const std::string& id) {
    const Element section(page, "section", {{"class", "verdict"}, {"id", id + "-verdict"}});
    page.add("h3", "Verdict");
    page.add("p", {{"class", "summary"}}, summaryOf(explanation));
    const Element tiles(page, "ul", {{"class", "tiles"}});
    for (std::size_t i = 0; i < explanation.size(); ++i) {
        addTile(page, explanation[i], outputId(id, i));
    }
}

} // namespace orvane::desk
