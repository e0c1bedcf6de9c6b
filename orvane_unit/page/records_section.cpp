// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/page/records_section.h"

#include "config/record_slots.h"
#include "kit/description/value_key.h"
#include "kit/description/value_places.h"
#include "kit/host/sparse_content.h"
#include "kit/host/text.h"
#include "orvane_unit/explain/reasons.h"
#include "orvane_unit/page/record_drawing.h"
#include "orvane_unit/page/table_titles.h"
#include "orvane_unit/page/wide_table.h"
#include "orvane_unit/report/names.h"
#include "orvane_unit/report/phrases.h"

#include <cstddef>
#include <cstdint>
#include <map>
#include <optional>
#include <utility>
#include <vector>

namespace orvane::desk {

namespace {

/// Where the record area begins on a disk that holds it whole.
std::uint64_t baseOf(const DecodedRecords& records) {
    return records.diskSize - static_cast<std::uint64_t>(RECORD_AREA_SIZE);
}

std::string summaryOf(const DecodedRecords& records) {
    if (records.diskTrouble) {
        return "Boot disk of " + kit::counted(records.diskSize, "byte") + ": " +
               reasonInfo(*records.diskTrouble).sentence + ".";
    }
    if (records.diskSize == 0) {
        return "A boot disk without a size.";
    }
    return "Boot disk of " + kit::counted(records.diskSize, "byte") +
           "; its record area begins at byte " + std::to_string(baseOf(records)) +
           ". Offsets are from there.";
}

/// The cells of some bytes, in hex and as text, without the zeros at their end.
void addContent(Markup& page, const std::optional<std::string>& bytes) {
    if (!bytes) {
        page.add("td", "can't be read");
        page.add("td", "");
        return;
    }
    const std::string content = kit::withoutTrailingZeros(*bytes);
    if (content.empty()) {
        page.add("td", "zeros");
        page.add("td", "");
        return;
    }
    for (const std::string& text : {kit::hexText(content), content}) {
        const Element cell(page, "td");
        page.add("code", text);
    }
}

/// A row of the table, still without its content.
void addPlace(Markup& page, const std::string& name, std::uint64_t offset, std::uint64_t size) {
    page.add("th", name);
    page.add("td", std::to_string(offset));
    page.add("td", std::to_string(size));
}

void addSlots(Markup& page, const DecodedRecords& records) {
    const WideTable table(page, "slots");
    addTitles(page, {"place", "offset", "bytes", "content", "as text"});
    const Element body(page, "tbody");
    for (const DecodedSlot& slot : records.slots) {
        const Element row(page, "tr", {{"data-key", keyText(kit::slotKey(slot.number))}});
        addPlace(page, "slot " + std::to_string(slot.number), slot.offset, slot.size);
        const std::string repeated = repeatedSlots(slot.number);
        if (repeated.empty()) {
            addContent(page, slot.bytes);
        } else {
            page.add("td", {{"colspan", "2"}}, "repeats " + repeated);
        }
    }
    const Element row(page, "tr", {{"data-key", keyText(kit::auxKey())}});
    addPlace(page, "auxiliary area", kit::valuePlace(kit::auxKey()).offset, AUX_AREA_SIZE);
    addContent(page, records.aux);
}

/// Adds what somebody wrote where nothing reads it; of much, only the begin.
void addRest(Markup& page, const DecodedRecords& records) {
    constexpr std::size_t MOST_RUNS = 16;
    constexpr std::size_t MOST_BYTES = 32;
    if (records.rest.empty()) {
        return;
    }
    page.add("p", "Bytes that are not zero, at unused places:");
    const Element list(page, "ul", {{"class", "rest"}});
    std::size_t done = 0;
    for (const auto& [offset, bytes] : records.rest) {
        if (done++ == MOST_RUNS) {
            page.add("li", kit::counted(records.rest.size() - MOST_RUNS, "more place"));
            return;
        }
        const Element item(page, "li",
                           {{"data-key", keyText(kit::diskBytesKey(baseOf(records) + offset))}});
        page.addText(kit::counted(bytes.size(), "byte") + " at " + std::to_string(offset) + ": ");
        page.add("code", kit::hexText(bytes.substr(0, MOST_BYTES)));
        page.addText(bytes.size() > MOST_BYTES ? " ..." : "");
    }
}

const char* sentenceOf(CrcVerdict verdict) {
    switch (verdict) {
    case CrcVerdict::computed:
        return "the disk stores no CRC to compare it with";
    case CrcVerdict::blank:
        return "the records are all zero";
    case CrcVerdict::ambiguous:
        return "all ones, which is also the value of a failure";
    case CrcVerdict::unreadable:
        return "the disk can't be read";
    }
    return "";
}

} // namespace

void addRecords(Markup& page, const DecodedRecords& records, const TuningArea& tuning,
                const std::string& id) {
    const Element section(page, "section", {{"class", "records"}, {"id", id + "-records"}});
    page.add("h3", "Record area of the boot disk");
    page.add("p", summaryOf(records));
    drawRecords(page, records, tuning);
    addSlots(page, records);
    addRest(page, records);
    const Element crc(page, "p",
                      {{"class", std::string("crc crc-") + nameOf(records.crcVerdict)},
                       {"data-key", keyText(kit::slotKey(CRC_RECORD_SLOT))}});
    page.addText("CRC over " + repeatedSlots(CRC_RECORD_SLOT) + ": ");
    page.add("code", hexNumber(records.crc, 8));
    page.addText(", ");
    page.add("strong", {{"class", "state"}}, nameOf(records.crcVerdict));
    page.addText(std::string(": ") + sentenceOf(records.crcVerdict) + ".");
}

} // namespace orvane::desk
