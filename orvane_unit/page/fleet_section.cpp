// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/page/fleet_section.h"

#include "kit/host/text.h"
#include "orvane_unit/explain/explanation.h"
#include "orvane_unit/page/unit_id.h"
#include "orvane_unit/page/wide_table.h"
#include "orvane_unit/report/names.h"
#include "orvane_unit/report/phrases.h"
#include "orvane_unit/show/decoded_unit.h"

#include <algorithm>
#include <cstddef>
#include <map>
#include <string>
#include <utility>

namespace orvane::desk {

namespace {

/// What a unit has in a column.
struct Value {
    std::string text;
    bool isState = false;   ///< of an output
    bool isIntended = true; ///< of a state
};

struct FleetColumn {
    std::string title;
    std::vector<Value> values; ///< a value for each unit
};

template <class ValueOf>
FleetColumn valueColumn(const std::string& title, const std::vector<PageUnit>& units,
                        const ValueOf& valueOf) {
    FleetColumn whole{title, {}};
    for (const PageUnit& unit : units) {
        whole.values.push_back({valueOf(unit.decoded), false, true});
    }
    return whole;
}

/// The output with an index; all units have the same outputs, since the options are the same.
FleetColumn outputColumn(const std::vector<PageUnit>& units, std::size_t index) {
    const std::string& path = units.front().explanation[index].path;
    FleetColumn whole{path.substr(path.rfind('/') + 1), {}};
    for (const PageUnit& unit : units) {
        const Output& output = unit.explanation[index];
        whole.values.push_back({nameOf(output.outcome), true, isIntended(output)});
    }
    return whole;
}

std::vector<FleetColumn> columnsOf(const std::vector<PageUnit>& units) {
    std::vector<FleetColumn> columns = {
        valueColumn("model", units, [](const DecodedUnit& unit) { return unit.identity.model; }),
        valueColumn("brand", units, [](const DecodedUnit& unit) { return unit.identity.brand; }),
        valueColumn(
            "right-hand drive", units,
            [](const DecodedUnit& unit) { return std::to_string(unit.identity.rightHandDrive); }),
        valueColumn(
            "audio profile", units,
            [](const DecodedUnit& unit) { return std::to_string(unit.identity.audioProfile); }),
        valueColumn("serial", units, [](const DecodedUnit& unit) { return unit.identity.serial; }),
        valueColumn("version", units,
                    [](const DecodedUnit& unit) { return unit.versions.version; }),
        valueColumn("CRC", units,
                    [](const DecodedUnit& unit) { return hexNumber(unit.records.crc, 8); }),
    };
    for (std::size_t i = 0; i < units.front().explanation.size(); ++i) {
        columns.push_back(outputColumn(units, i));
    }
    return columns;
}

std::map<std::string, std::size_t> countsOf(const FleetColumn& column) {
    std::map<std::string, std::size_t> counts;
    for (const Value& value : column.values) {
        ++counts[value.text];
    }
    return counts;
}

/// For each value whether more than half of the units have another one in common.
std::vector<bool> rareValues(const FleetColumn& column) {
    const std::map<std::string, std::size_t> counts = countsOf(column);
    const auto most =
        std::max_element(counts.begin(), counts.end(), [](const auto& one, const auto& other) {
            return one.second < other.second;
        });
    std::vector<bool> rare;
    for (const Value& value : column.values) {
        rare.push_back(most->second * 2 > column.values.size() && value.text != most->first);
    }
    return rare;
}

void addCell(Markup& page, const Value& value, bool isRare) {
    const std::string look = value.isState ? "tile state-" + value.text : "value";
    const Element cell(
        page, "td",
        {{"class", look + (value.isIntended ? "" : " fallback") + (isRare ? " rare" : "")}});
    page.addText(value.text);
    if (!value.isIntended) {
        page.add("span", {{"class", "sign"}}, "not as intended");
    }
    if (isRare) {
        page.add("span", {{"class", "sign"}}, "\u2260 most");
    }
}

/// "5 generated, 1 stock" below the column of an output.
void addCounts(Markup& page, const std::vector<FleetColumn>& columns) {
    const Element foot(page, "tfoot");
    const Element row(page, "tr");
    page.add("th", {{"scope", "row"}}, "count of each state");
    for (const FleetColumn& column : columns) {
        std::string text;
        for (const auto& [value, count] : countsOf(column)) {
            text += (text.empty() ? "" : ", ") + std::to_string(count) + " " + value;
        }
        page.add("td", column.values.front().isState ? text : "");
    }
}

std::string summaryOf(const std::vector<PageUnit>& units) {
    const auto good = std::count_if(units.begin(), units.end(), [](const PageUnit& unit) {
        return isIntended(unit.explanation);
    });
    return kit::counted(units.size(), "unit") + ", " + std::to_string(good) +
           " of them all as intended.";
}

} // namespace

void addFleet(Markup& page, const std::vector<PageUnit>& units) {
    const std::vector<FleetColumn> columns = columnsOf(units);
    std::vector<std::vector<bool>> rare;
    const Element section(page, "section", {{"id", "fleet"}});
    page.add("h2", "All units");
    page.add("p", {{"class", "summary"}}, summaryOf(units));
    const WideTable table(page, "fleet");
    {
        const Element head(page, "thead");
        const Element row(page, "tr");
        page.add("th", {{"scope", "col"}}, "unit");
        for (const FleetColumn& column : columns) {
            page.add("th", {{"scope", "col"}}, column.title);
            rare.push_back(rareValues(column));
        }
    }
    {
        const Element body(page, "tbody");
        for (std::size_t i = 0; i < units.size(); ++i) {
            const Element row(page, "tr");
            {
                const Element name(page, "th", {{"scope", "row"}});
                page.add("a", {{"href", "#" + unitId(i)}}, units[i].name);
            }
            for (std::size_t at = 0; at < columns.size(); ++at) {
                addCell(page, columns[at].values[i], rare[at][i]);
            }
        }
    }
    addCounts(page, columns);
}

} // namespace orvane::desk
