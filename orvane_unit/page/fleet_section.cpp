// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/page/fleet_section.h"

#include "identity/model_names.h"
#include "identity/vehicle_identity.h"
#include "kit/host/text.h"
#include "orvane_unit/explain/explanation.h"
#include "orvane_unit/page/unit_id.h"
#include "orvane_unit/page/wide_table.h"
#include "orvane_unit/report/names.h"
#include "orvane_unit/report/phrases.h"
#include "orvane_unit/show/decoded_unit.h"
#include "tuning/audio_profile.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <utility>

namespace orvane::desk {

namespace {

/// What a unit has in a column.
struct Value {
    std::string text;
    std::string trouble; ///< why it is not to be taken for a good one; empty if it is
};

struct FleetColumn {
    enum class Kind { text, number, state };

    std::string title;
    Kind kind = Kind::text;
    std::vector<Value> values; ///< a value for each unit
};

template <class ValueOf>
FleetColumn valueColumn(const std::string& title, FleetColumn::Kind kind,
                        const std::vector<PageUnit>& units, const ValueOf& valueOf) {
    FleetColumn whole{title, kind, {}};
    for (const PageUnit& unit : units) {
        whole.values.push_back(valueOf(unit.decoded));
    }
    return whole;
}

/// A value that is the tool's own default if it was not read. It may look like any other.
Value readValue(std::string text, bool isRead) {
    return {std::move(text), isRead ? "" : "default, not read"};
}

/// What the tool makes of a parameter.
Value paramValue(std::string text, const DecodedUnit& unit, std::uint16_t number) {
    return readValue(std::move(text), unit.image.params.at(number - 1U).raw.has_value());
}

Value modelOf(const DecodedUnit& unit) {
    Value value = paramValue(unit.identity.model, unit, MODEL_PARAM);
    const std::optional<std::uint16_t> code = unit.image.params.at(MODEL_PARAM - 1U).raw;
    if (code && !hasModelName(static_cast<std::uint8_t>(*code))) {
        value.trouble = "default, no model has code " + std::to_string(*code);
    }
    return value;
}

Value brandOf(const DecodedUnit& unit) {
    return paramValue(unit.identity.brand, unit, BRAND_PARAM);
}

Value rightHandDriveOf(const DecodedUnit& unit) {
    return paramValue(std::to_string(unit.identity.rightHandDrive), unit, RIGHT_HAND_DRIVE_PARAM);
}

Value audioProfileOf(const DecodedUnit& unit) {
    return paramValue(std::to_string(unit.identity.audioProfile), unit, AUDIO_PROFILE_PARAM);
}

Value serialOf(const DecodedUnit& unit) {
    const bool isRead = unit.records.slots.at(SERIAL_RECORD_SLOT).bytes.has_value();
    return isRead && unit.identity.serial.empty() ? Value{"", "empty"}
                                                  : readValue(unit.identity.serial, isRead);
}

Value versionOf(const DecodedUnit& unit) {
    const std::string& version = unit.versions.version;
    return {version, version.empty() ? "none found" : ""};
}

Value crcOf(const DecodedUnit& unit) {
    const DecodedRecords& records = unit.records;
    const bool isComputed = records.crcVerdict == CrcVerdict::computed;
    return {hexNumber(records.crc, 8), isComputed ? "" : nameOf(records.crcVerdict)};
}

/// The output with an index; all units have the same outputs, since the options are the same.
FleetColumn outputColumn(const std::vector<PageUnit>& units, std::size_t index) {
    const std::string& path = units.front().explanation[index].path;
    FleetColumn whole{path.substr(path.rfind('/') + 1), FleetColumn::Kind::state, {}};
    for (const PageUnit& unit : units) {
        const Output& output = unit.explanation[index];
        whole.values.push_back(
            {nameOf(output.outcome), isIntended(output) ? "" : "not as intended"});
    }
    return whole;
}

std::vector<FleetColumn> columnsOf(const std::vector<PageUnit>& units) {
    using Kind = FleetColumn::Kind;
    std::vector<FleetColumn> columns = {
        valueColumn("model", Kind::text, units, modelOf),
        valueColumn("brand", Kind::text, units, brandOf),
        valueColumn("right-hand drive", Kind::number, units, rightHandDriveOf),
        valueColumn("audio profile", Kind::number, units, audioProfileOf),
        valueColumn("serial", Kind::text, units, serialOf),
        valueColumn("version", Kind::text, units, versionOf),
        valueColumn("CRC", Kind::number, units, crcOf),
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

/// For each value whether another one is more frequent.
std::vector<bool> rareValues(const FleetColumn& column) {
    const std::map<std::string, std::size_t> counts = countsOf(column);
    std::size_t most = 0;
    for (const auto& [value, count] : counts) {
        most = std::max(most, count);
    }
    std::vector<bool> rare;
    for (const Value& value : column.values) {
        rare.push_back(counts.at(value.text) < most);
    }
    return rare;
}

void addCell(Markup& page, const Value& value, bool isState, bool isRare) {
    const std::string look = isState ? "tile state-" + value.text : "value";
    const Element cell(
        page, "td",
        {{"class", look + (value.trouble.empty() ? "" : " fallback") + (isRare ? " rare" : "")}});
    page.addText(value.text);
    if (!value.trouble.empty()) {
        page.add("span", {{"class", "sign"}}, value.trouble);
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
        page.add("td", column.kind == FleetColumn::Kind::state ? text : "");
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
            const bool isNumber = column.kind == FleetColumn::Kind::number;
            page.add("th", {{"scope", "col"}, {"data-order", isNumber ? "number" : ""}},
                     column.title);
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
                addCell(page, columns[at].values[i], columns[at].kind == FleetColumn::Kind::state,
                        rare[at][i]);
            }
        }
    }
    addCounts(page, columns);
}

} // namespace orvane::desk
