// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/page/tuning_section.h"

#include "kit/description/value_key.h"
#include "kit/host/bytes.h"
#include "kit/host/sparse_content.h"
#include "kit/tuning/tuning_encode.h"
#include "orvane_unit/explain/reasons.h"
#include "orvane_unit/page/bar_plot.h"
#include "orvane_unit/page/content_text.h"
#include "orvane_unit/page/wide_table.h"
#include "orvane_unit/report/phrases.h"
#include "tuning/audio_profile.h"
#include "tuning/dps_block.h"

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <vector>

namespace orvane::desk {

namespace {

const DpsBlock& blockOf(const TuningArea& tuning, std::int32_t id) {
    return tuning.blocks.at(static_cast<std::size_t>(id));
}

std::vector<std::int32_t> valuesOf(const DpsBlock& block, const DpsField& field) {
    std::vector<std::int32_t> values;
    for (std::size_t element = 0; element < field.count; ++element) {
        values.push_back(decodeField(block, field, element));
    }
    return values;
}

std::string listText(const std::vector<std::int32_t>& values) {
    std::string text;
    for (const std::int32_t value : values) {
        text += (text.empty() ? "" : ", ") + std::to_string(value);
    }
    return text;
}

void addWord(Markup& page, const DpsField& field, std::int32_t code) {
    const std::string word = fieldWord(field, code);
    if (word.empty()) {
        page.add("span", {{"class", "word no-word sign"}}, "no word");
    } else {
        page.add("span", {{"class", "word code-" + std::to_string(code)}}, word);
    }
}

/// The blocks that the tool reads, by number.
std::vector<std::int32_t> readBlocks() {
    std::vector<std::int32_t> ids;
    for (const TuningOutput& output : TUNING_OUTPUTS) {
        ids.push_back(output.blockId);
    }
    std::sort(ids.begin(), ids.end());
    return ids;
}

/// A field in each of the blocks that the tool reads.
struct FieldValues {
    const DpsField& field;
    std::vector<std::int32_t> blocks;
    std::vector<std::vector<std::int32_t>> values; ///< in each of the blocks

    bool isSame() const {
        return std::adjacent_find(values.begin(), values.end(), std::not_equal_to<>()) ==
               values.end();
    }
};

FieldValues fieldValues(const TuningArea& tuning, const DpsField& field) {
    FieldValues all{field, readBlocks(), {}};
    for (const std::int32_t id : all.blocks) {
        all.values.push_back(valuesOf(blockOf(tuning, id), field));
    }
    return all;
}

void addValue(Markup& page, const FieldValues& all, std::size_t index) {
    const std::vector<std::int32_t>& values = all.values[index];
    const auto block = static_cast<std::uint64_t>(all.blocks[index]);
    const Element cell(page, "td",
                       {{"data-key", keyText(kit::tuningFieldKey(block, all.field.key))}});
    if (all.field.kind == DpsKind::list) {
        drawBars(page, all.values, index);
        page.add("span", {{"class", "numbers"}}, listText(values));
        return;
    }
    if (all.field.kind != DpsKind::number) {
        addWord(page, all.field, values.front());
        page.addText(" ");
    }
    page.addText(std::to_string(values.front()));
}

void addField(Markup& page, const FieldValues& all) {
    const Element row(page, "tr", {{"class", all.isSame() ? "" : "differs"}});
    page.add("th", all.field.key);
    for (std::size_t i = 0; i < all.values.size(); ++i) {
        addValue(page, all, i);
    }
    page.add("td", {{"class", "sign"}}, all.isSame() ? "same" : "\u2260 differs");
}

void addFields(Markup& page, const TuningArea& tuning) {
    const WideTable table(page, "fields");
    {
        const Element head(page, "thead");
        const Element row(page, "tr");
        page.add("th", "field");
        for (const std::int32_t block : readBlocks()) {
            page.add("th", "block " + std::to_string(block) + ", " + purposeOf(block));
        }
        page.add("th", "comparison");
    }
    const Element body(page, "tbody");
    for (const DpsField& field : DPS_LAYOUT) {
        addField(page, fieldValues(tuning, field));
    }
}

/// Adds the bits that no field reads and that somebody wrote all the same.
void addUnread(Markup& page, const TuningArea& tuning, std::int32_t id) {
    const DpsBlock unread = kit::withoutFields(blockOf(tuning, id));
    for (std::size_t at = 0; at < unread.bytes.size(); ++at) {
        if (unread.bytes.at(at) != 0) {
            const Element item(
                page, "li",
                {{"data-key", keyText(kit::tuningRawKey(static_cast<std::uint64_t>(id)))}});
            page.addText("block " + std::to_string(id) + ", byte " + std::to_string(at) +
                         ": no field reads ");
            page.add("code", hexNumber(unread.bytes.at(at), 2));
        }
    }
}

void addOtherBlocks(Markup& page, const TuningArea& tuning) {
    const std::vector<std::int32_t> read = readBlocks();
    for (std::int32_t id = 0; id < DPS_BLOCK_COUNT; ++id) {
        if (std::find(read.begin(), read.end(), id) == read.end()) {
            const auto& bytes = blockOf(tuning, id).bytes;
            page.add("li",
                     {{"data-key", keyText(kit::tuningBlockKey(static_cast<std::uint64_t>(id)))}},
                     "block " + std::to_string(id) + ", which no run reads: " +
                         contentText(kit::sparseContent(kit::Bytes(bytes.begin(), bytes.end()))));
        }
    }
}

} // namespace

void addTuning(Markup& page, const TuningArea& tuning, const std::string& id) {
    const Element section(page, "section", {{"class", "tuning"}, {"id", id + "-tuning"}});
    page.add("h3", "Tuning blocks");
    if (tuning.reason != Reason::fromTuningBlock) {
        page.add("p", {{"class", "fallback"}}, reasonInfo(tuning.reason).sentence + ".");
        return;
    }
    addFields(page, tuning);
    const Element rest(page, "ul", {{"class", "rest"}});
    for (const std::int32_t block : readBlocks()) {
        addUnread(page, tuning, block);
    }
    addOtherBlocks(page, tuning);
}

} // namespace orvane::desk
