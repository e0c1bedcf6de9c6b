// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/report/comparison_text.h"

#include "kit/host/text.h"
#include "orvane_unit/compare/text_diff.h"
#include "orvane_unit/compare/unit_values.h"
#include "orvane_unit/explain/explanation.h"
#include "orvane_unit/report/terminal.h"
#include "orvane_unit/report/unified_diff.h"

#include <map>
#include <ostream>
#include <set>
#include <string>
#include <utility>

namespace orvane::desk {

namespace {

void printMoved(std::ostream& out, const MovedOutput& output) {
    out << "  " << painted(Colour::place, output.path);
    if (output.before != output.after) {
        out << ": " << outcomeName(output.before) << " -> " << outcomeName(output.after);
    }
    out << '\n';
    for (const MovedLine& line : output.lines) {
        const bool isRemoved = line.line.kind == DiffLine::Kind::removed;
        const std::string text = (isRemoved ? "-" : "+") + printableLine(line.line.text);
        out << "    " << painted(isRemoved ? Colour::removed : Colour::added, text) << '\n';
    }
}

std::string valueForEyes(const std::string& value) {
    return value.empty() ? "(empty)" : value;
}

/// A key with a number at its end, taken apart.
struct NumberedKey {
    std::string stem;
    unsigned long number = 0;
    bool isNumbered = false;

    explicit NumberedKey(const std::string& key) : stem(key) {
        const std::size_t dot = key.rfind('.');
        const std::string end = key.substr(dot + 1);
        isNumbered = dot != std::string::npos && !end.empty() &&
                     end.find_first_not_of("0123456789") == std::string::npos;
        if (isNumbered) {
            stem = key.substr(0, dot + 1);
            number = std::stoul(end);
        }
    }
};

/// "param.1-21", "tuning.0: 44 fields": neighbours in one word.
std::vector<std::string> inRanges(const std::vector<std::string>& keys) {
    std::vector<std::string> ranges;
    for (std::size_t i = 0; i < keys.size();) {
        const NumberedKey first(keys[i]);
        std::size_t next = i + 1;
        for (; first.isNumbered && next < keys.size(); ++next) {
            const NumberedKey key(keys[next]);
            if (!key.isNumbered || key.stem != first.stem ||
                key.number != first.number + (next - i)) {
                break;
            }
        }
        ranges.push_back(next - i == 1
                             ? keys[i]
                             : keys[i] + "-" + std::to_string(NumberedKey(keys[next - 1]).number));
        i = next;
    }
    return ranges;
}

/// "tuning.0: 44 fields" for a whole block that moves nothing.
std::vector<std::string> withWholeBlocks(const std::vector<std::string>& keys) {
    constexpr std::size_t BLOCK_PREFIX = sizeof "tuning.0" - 1;
    constexpr std::size_t FIELDS = 44;
    std::map<std::string, std::size_t> fields;
    for (const std::string& key : keys) {
        if (key.compare(0, 7, "tuning.") == 0) {
            ++fields[key.substr(0, BLOCK_PREFIX)];
        }
    }
    std::vector<std::string> merged;
    for (const std::string& key : keys) {
        const auto block = fields.find(key.substr(0, BLOCK_PREFIX));
        if (block == fields.end() || block->second != FIELDS) {
            merged.push_back(key);
        } else if (merged.empty() || merged.back() != block->first) {
            merged.push_back(block->first);
        }
    }
    return merged;
}

} // namespace

void printConsequences(std::ostream& out, const std::vector<Consequence>& consequences) {
    for (const Consequence& consequence : consequences) {
        const ValueChange& change = consequence.change;
        if (change.key.empty()) {
            out << "of no value that differs:\n";
        } else {
            out << kit::printable(change.key) << ": "
                << painted(Colour::removed, valueForEyes(change.before)) << " -> "
                << painted(Colour::added, valueForEyes(change.after)) << '\n';
        }
        if (consequence.moved.empty()) {
            out << "  " << painted(Colour::faint, "moves no output") << '\n';
        }
        for (const MovedOutput& output : consequence.moved) {
            printMoved(out, output);
        }
    }
}

void printImpacts(std::ostream& out, const std::vector<Impact>& impacts) {
    std::vector<std::string> still;
    for (const Impact& impact : impacts) {
        if (impact.lines.empty()) {
            still.push_back(impact.key);
            continue;
        }
        out << painted(Colour::place, impact.key) << ": " << impact.moving << " of "
            << kit::counted(impact.tried, "value") << " moved\n";
        for (const std::string& line : impact.lines) {
            out << "  " << line << '\n';
        }
    }
    out << kit::counted(still.size(), "input") << " moved nothing:\n";
    for (const std::string& range : inRanges(withWholeBlocks(still))) {
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
