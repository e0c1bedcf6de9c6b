// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/page/record_drawing.h"

#include "config/record_slots.h"
#include "kit/description/value_key.h"
#include "kit/description/value_places.h"
#include "kit/host/bytes.h"
#include "kit/host/sparse_content.h"
#include "kit/host/text.h"
#include "orvane_unit/explain/reasons.h"
#include "orvane_unit/page/content_text.h"
#include "tuning/dps_block.h"

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <utility>
#include <vector>

namespace orvane::desk {

namespace {

/// How parts of a kind are drawn.
struct Look {
    const char* className;
    const char* fill; ///< where there is no style
};

constexpr Look SLOT = {"slot", "#dbe9f9"};
constexpr Look AUX = {"aux", "#dff3dc"};
constexpr Look TUNING = {"tuning", "#fdeccb"};
constexpr Look SPARE = {"spare", "#eceef0"};
constexpr Look NOTHING = {"nothing", "#eceef0"};

/// A part of the record area: bytes from `begin` to before `end`, from the area's base.
struct Part {
    std::uint64_t begin = 0;
    std::uint64_t end = 0;
    Look look;
    std::string name;
    std::string label; ///< short
    kit::ValueKey key;
    std::optional<kit::SparseContent> content; ///< none where it can't be read
};

/// What is known of the content of the parts.
class Contents {
public:
    Contents(const DecodedRecords& records, const TuningArea& tuning)
        : records_(records), tuning_(tuning) {}

    /// Of the tuning block with an id, which begins at `offset`.
    std::optional<kit::SparseContent> block(std::uint64_t id, std::uint64_t offset) const {
        if (tuning_.reason != Reason::fromTuningBlock) {
            return std::nullopt;
        }
        const auto& bytes = tuning_.blocks.at(id).bytes;
        return kit::sparseContent(kit::Bytes(bytes.begin(), bytes.end()), offset);
    }

    /// Of bytes that have no name, from `begin` to before `end`.
    std::optional<kit::SparseContent> rest(std::uint64_t begin, std::uint64_t end) const {
        if (records_.diskTrouble) {
            return std::nullopt;
        }
        kit::SparseContent found;
        for (const auto& [offset, bytes] : records_.rest) {
            const std::uint64_t from = std::max(begin, offset);
            const std::uint64_t to = std::min<std::uint64_t>(end, offset + bytes.size());
            if (from < to) {
                found.merge(kit::sparseContent(bytes.substr(from - offset, to - from), from));
            }
        }
        return found;
    }

private:
    const DecodedRecords& records_;
    const TuningArea& tuning_;
};

/// Of bytes that begin at `offset`.
std::optional<kit::SparseContent> contentOf(const std::optional<kit::Bytes>& bytes,
                                            std::uint64_t offset) {
    return bytes ? std::optional(kit::sparseContent(*bytes, offset)) : std::nullopt;
}

/// Everything that has a name, in the order of the disk. A slot that repeats others is not drawn.
std::vector<Part> namedParts(const DecodedRecords& records, const Contents& contents) {
    std::vector<Part> parts;
    for (const DecodedSlot& slot : records.slots) {
        if (kit::slotsWithin(slot.number).empty()) {
            const std::string name = std::to_string(slot.number);
            parts.push_back({slot.offset, slot.offset + slot.size, SLOT, "slot " + name, name,
                             kit::slotKey(slot.number), contentOf(slot.bytes, slot.offset)});
        }
    }
    const std::uint64_t aux = kit::valuePlace(kit::auxKey()).offset;
    parts.push_back({aux, aux + AUX_AREA_SIZE, AUX, "auxiliary area", "aux", kit::auxKey(),
                     contentOf(records.aux, aux)});
    for (std::uint64_t id = 0; id < DPS_BLOCK_COUNT; ++id) {
        const kit::ValueKey key = kit::tuningBlockKey(id);
        const std::uint64_t begin = kit::valuePlace(key).offset;
        parts.push_back({begin, begin + DPS_BLOCK_SIZE, TUNING,
                         "tuning block " + std::to_string(id), std::to_string(id), key,
                         contents.block(id, begin)});
    }
    const std::uint64_t begin = parts.back().end;
    const std::uint64_t end = kit::valuePlace(kit::tuningBlockKey(0)).offset + TUNING_AREA_SIZE;
    parts.push_back({begin,
                     end,
                     SPARE,
                     "rest of the tuning area, which nothing reads",
                     "",
                     {},
                     contents.rest(begin, end)});
    std::sort(parts.begin(), parts.end(),
              [](const Part& one, const Part& other) { return one.begin < other.begin; });
    return parts;
}

/// The same, and between them what is unused.
std::vector<Part> allParts(const DecodedRecords& records, const TuningArea& tuning) {
    const Contents contents(records, tuning);
    std::vector<Part> parts;
    std::uint64_t done = 0;
    const auto addGap = [&parts, &done, &contents](std::uint64_t end) {
        if (done < end) {
            parts.push_back({done, end, NOTHING, "unused", "", {}, contents.rest(done, end)});
        }
    };
    for (Part& part : namedParts(records, contents)) {
        addGap(part.begin);
        done = part.end;
        parts.push_back(std::move(part));
    }
    addGap(RECORD_AREA_SIZE);
    return parts;
}

/// The units of the drawing: a thousandth of its width is 10.
constexpr std::uint64_t WIDTH = 10000;
constexpr std::uint64_t STRIP = 300;
constexpr std::uint64_t GAP = 400;
constexpr std::uint64_t LETTER = 75; ///< about the width of one

/// A rectangle that shows the bytes from `begin` to before `end`.
struct Strip {
    std::uint64_t begin;
    std::uint64_t end;
    std::uint64_t x;
    std::uint64_t y;
    std::uint64_t width;

    std::uint64_t at(std::uint64_t offset) const {
        return x + (std::clamp(offset, begin, end) - begin) * width / (end - begin);
    }
};

std::string number(std::uint64_t value) {
    return std::to_string(value);
}

void drawPart(Markup& page, const Strip& strip, const Part& part) {
    constexpr std::uint64_t LEAST = 20; // so that it can be seen and pointed at
    const std::uint64_t left = strip.at(part.begin);
    const std::uint64_t width = strip.at(part.end) - left;
    if (width < LEAST) {
        return; // magnified in another strip
    }
    const Element group(
        page, "g",
        {{"class", std::string("part ") + part.look.className}, {"data-key", keyText(part.key)}});
    page.add("title", part.name + ": " + kit::counted(part.end - part.begin, "byte") + " at " +
                          number(part.begin));
    page.add("desc", contentText(part.content));
    page.addShape("rect", {{"x", number(left)},
                           {"y", number(strip.y)},
                           {"width", number(width)},
                           {"height", number(STRIP)},
                           {"fill", part.look.fill}});
    for (const std::string& label : {part.name, part.label}) {
        if (!label.empty() && label.size() * LETTER < width) {
            page.add(
                "text",
                {{"x", number(left + width / 2)}, {"y", number(strip.y + 195)}, {"stroke", "none"}},
                label);
            break;
        }
    }
}

void drawStrip(Markup& page, const Strip& strip, const std::vector<Part>& parts) {
    for (const Part& part : parts) {
        if (part.begin < strip.end && part.end > strip.begin) {
            drawPart(page, strip, part);
        }
    }
}

/// Marks a piece of `from`, and draws lines from there to the ends of `to`, which shows it
/// magnified.
void drawMagnifier(Markup& page, const Strip& from, const Strip& to) {
    page.addShape("rect", {{"class", "magnified"},
                           {"fill", SLOT.fill},
                           {"x", number(from.at(to.begin))},
                           {"y", number(from.y)},
                           {"width", number(from.at(to.end) - from.at(to.begin))},
                           {"height", number(STRIP)}});
    page.addShape("path", {{"class", "magnifier"},
                           {"fill", "none"},
                           {"d", "M" + number(from.at(to.begin)) + " " + number(from.y + STRIP) +
                                     "L" + number(to.x) + " " + number(to.y) + "M" +
                                     number(from.at(to.end)) + " " + number(from.y + STRIP) + "L" +
                                     number(to.x + to.width) + " " + number(to.y)}});
}

/// The runs of slots with nothing between them, side by side.
std::vector<Strip> slotStrips(const std::vector<Part>& parts, std::uint64_t y) {
    std::vector<Strip> strips;
    const Part* before = nullptr;
    for (const Part& part : parts) {
        const bool isSlot = part.key.kind == kit::ValueKey::Kind::slot;
        if (isSlot && before != nullptr) {
            strips.back().end = part.end;
        } else if (isSlot) {
            strips.push_back({part.begin, part.end, 0, y, 0});
        }
        before = isSlot ? &part : nullptr;
    }
    const std::uint64_t each = WIDTH / std::max<std::size_t>(strips.size(), 1);
    for (std::size_t i = 0; i < strips.size(); ++i) {
        strips[i].x = i * each + (i == 0 ? 0 : GAP / 2);
        strips[i].width = each - (i == 0 ? 0 : GAP / 2);
    }
    return strips;
}

} // namespace

void drawRecords(Markup& page, const DecodedRecords& records, const TuningArea& tuning) {
    const std::vector<Part> parts = allParts(records, tuning);
    const Strip whole{0, RECORD_AREA_SIZE, 0, 0, WIDTH};
    const Strip begin{0, parts.back().begin, 0, STRIP + GAP, WIDTH};
    const std::uint64_t lastY = begin.y + STRIP + GAP;
    const Element drawing(page, "svg",
                          {{"class", "drawing"},
                           {"role", "img"},
                           {"aria-label", "The record area to scale; the table has the same"},
                           {"viewBox", "0 0 " + number(WIDTH) + " " + number(lastY + STRIP)},
                           // for a reader that lets a page have no style
                           {"stroke", "#565e66"},
                           {"stroke-width", "12"},
                           {"font-size", "120"},
                           {"text-anchor", "middle"}});
    drawStrip(page, whole, parts);
    drawMagnifier(page, whole, begin);
    drawStrip(page, begin, parts);
    for (const Strip& strip : slotStrips(parts, lastY)) {
        drawMagnifier(page, begin, strip);
        drawStrip(page, strip, parts);
    }
}

} // namespace orvane::desk
