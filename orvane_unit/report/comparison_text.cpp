// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/report/comparison_text.h"

#include "kit/description/value_key.h"
#include "kit/host/text.h"
#include "kit/unit/unit_values.h"
#include "orvane_unit/compare/text_diff.h"
#include "orvane_unit/report/names.h"
#include "orvane_unit/report/phrases.h"
#include "orvane_unit/report/terminal.h"
#include "orvane_unit/report/unified_diff.h"
#include "tuning/dps_block.h"

#include <cstdint>
#include <map>
#include <ostream>
#include <set>
#include <string>

namespace orvane::desk {

namespace {

using kit::ValueKey;

void printDifference(std::ostream& out, const OutputDifference& output) {
    out << "  " << painted(Colour::place, output.path);
    if (output.before != output.after) {
        out << ": " << nameOf(output.before) << " -> " << nameOf(output.after);
    }
    out << '\n';
    for (const DifferingLine& line : output.lines) {
        const bool isRemoved = line.line.kind == DiffLine::Kind::removed;
        const std::string text = (isRemoved ? "-" : "+") + printableLine(line.line.text);
        out << "    " << painted(isRemoved ? Colour::removed : Colour::added, text) << '\n';
    }
}

std::string valueText(const std::string& value) {
    return value.empty() ? "(empty)" : kit::printable(value);
}

bool isByteOfSlot(const ValueKey& key) {
    return key.kind == ValueKey::Kind::slotByte;
}

/// The key of the next parameter, byte of the slot or tuning block; empty for other keys.
ValueKey nextKey(ValueKey key) {
    if (isByteOfSlot(key)) {
        ++key.offset;
    } else if (key.kind == ValueKey::Kind::param || key.kind == ValueKey::Kind::tuningBlock) {
        ++key.number;
    } else {
        return {};
    }
    return key;
}

/// The keys as texts, those with consecutive numbers as one: "param.1-21".
std::vector<std::string> inRanges(const std::vector<ValueKey>& keys) {
    std::vector<std::string> ranges;
    for (std::size_t first = 0, end = 0; first < keys.size(); first = end) {
        for (end = first + 1; end < keys.size() && keys[end] == nextKey(keys[end - 1]);) {
            ++end;
        }
        const ValueKey& last = keys[end - 1];
        const std::uint64_t number = isByteOfSlot(last) ? last.offset : last.number;
        ranges.push_back(keyText(keys[first]) +
                         (end - first == 1 ? "" : "-" + std::to_string(number)));
    }
    return ranges;
}

/// The keys, with that of a whole block in place of those of all its fields.
std::vector<ValueKey> withWholeBlocks(const std::vector<ValueKey>& keys) {
    std::map<std::uint64_t, std::size_t> fieldsOfBlocks;
    for (const ValueKey& key : keys) {
        if (key.kind == ValueKey::Kind::tuningField) {
            ++fieldsOfBlocks[key.number];
        }
    }
    std::vector<ValueKey> merged;
    for (const ValueKey& key : keys) {
        const ValueKey block = kit::tuningBlockKey(key.number);
        if (key.kind != ValueKey::Kind::tuningField ||
            fieldsOfBlocks[key.number] != DPS_FIELD_COUNT) {
            merged.push_back(key);
        } else if (merged.empty() || merged.back() != block) {
            merged.push_back(block);
        }
    }
    return merged;
}

} // namespace

void printConsequences(std::ostream& out, const std::vector<Consequence>& consequences) {
    for (const Consequence& consequence : consequences) {
        const kit::ValueChange& change = consequence.change;
        if (change.key.isEmpty()) {
            out << "explained by no value:\n";
        } else {
            out << kit::printable(keyText(change.key)) << ": "
                << painted(Colour::removed, valueText(change.before)) << " -> "
                << painted(Colour::added, valueText(change.after)) << '\n';
        }
        if (consequence.outputs.empty()) {
            out << "  " << painted(Colour::faint, "changes no output") << '\n';
        }
        for (const OutputDifference& output : consequence.outputs) {
            printDifference(out, output);
        }
    }
}

void printImpacts(std::ostream& out, const std::vector<Impact>& impacts) {
    std::vector<ValueKey> inert;
    for (const Impact& impact : impacts) {
        if (impact.lines.empty()) {
            inert.push_back(impact.key);
            continue;
        }
        out << painted(Colour::place, keyText(impact.key)) << ": " << impact.changing << " of "
            << kit::counted(impact.tried, "value")
            << (impact.changing == 1 ? " changes" : " change") << " the output\n";
        for (const OutputLine& line : impact.lines) {
            out << "  " << lineText(line) << '\n';
        }
    }
    out << kit::counted(inert.size(), "input") << (inert.size() == 1 ? " changes" : " change")
        << " nothing:\n";
    for (const std::string& range : inRanges(withWholeBlocks(inert))) {
        out << "  " << range << '\n';
    }
}

void printProgress(std::ostream& terminal, std::size_t done, std::size_t all) {
    constexpr std::size_t WIDTH = 40;
    const std::size_t filled = done * WIDTH / all;
    if (done == all) {
        terminal << "\r\033[K" << std::flush;
    } else if (filled != (done - 1) * WIDTH / all) {
        terminal << "\r[" << std::string(filled, '#') << std::string(WIDTH - filled, ' ') << "] "
                 << done << " of " << all << std::flush;
    }
}

} // namespace orvane::desk
