// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/compare/text_diff.h"

#include <dtl/dtl.hpp>

#include <algorithm>
#include <type_traits>

namespace orvane::desk {

namespace {

std::vector<std::string> linesOf(const std::string& text) {
    std::vector<std::string> lines;
    for (std::size_t begin = 0; begin < text.size();) {
        const std::size_t end = std::min(text.find('\n', begin), text.size() - 1) + 1;
        lines.push_back(text.substr(begin, end - begin));
        begin = end;
    }
    return lines;
}

/// All lines of both texts, common ones once, with their numbers.
std::vector<DiffLine> editScript(const std::string& before, const std::string& after) {
    dtl::Diff<std::string> diff(linesOf(before), linesOf(after));
    diff.onHuge();
    diff.compose();
    std::vector<DiffLine> lines;
    std::size_t oldNumber = 0;
    std::size_t newNumber = 0;
    for (const auto& [text, info] : diff.getSes().getSequence()) {
        if (info.type == dtl::SES_DELETE) {
            lines.push_back({DiffLine::Kind::removed, text, ++oldNumber, 0});
        } else if (info.type == dtl::SES_ADD) {
            lines.push_back({DiffLine::Kind::added, text, 0, ++newNumber});
        } else {
            lines.push_back({DiffLine::Kind::common, text, ++oldNumber, ++newNumber});
        }
    }
    // Where lines replace others, the old ones come first.
    for (auto begin = lines.begin(); begin != lines.end();) {
        const auto isCommon = [](const DiffLine& line) {
            return line.kind == DiffLine::Kind::common;
        };
        const auto end = std::find_if(begin, lines.end(), isCommon);
        std::stable_partition(
            begin, end, [](const DiffLine& line) { return line.kind == DiffLine::Kind::removed; });
        begin = std::find_if_not(end, lines.end(), isCommon);
    }
    return lines;
}

/// A hunk of the lines from `begin` to `end`.
Hunk hunkOf(const std::vector<DiffLine>& script, std::size_t begin, std::size_t end) {
    Hunk hunk;
    for (std::size_t i = 0; i < begin; ++i) {
        hunk.before += script[i].before != 0 ? 1U : 0U;
        hunk.after += script[i].after != 0 ? 1U : 0U;
    }
    for (std::size_t i = begin; i < end; ++i) {
        hunk.beforeCount += script[i].before != 0 ? 1U : 0U;
        hunk.afterCount += script[i].after != 0 ? 1U : 0U;
        hunk.lines.push_back(script[i]);
    }
    hunk.before += hunk.beforeCount != 0 ? 1U : 0U;
    hunk.after += hunk.afterCount != 0 ? 1U : 0U;
    return hunk;
}

} // namespace

std::vector<Hunk> differingHunks(const std::string& before, const std::string& after) {
    if (before == after) {
        return {};
    }
    constexpr std::size_t CONTEXT = 3; // common lines around a change
    const std::vector<DiffLine> script = editScript(before, after);
    std::vector<Hunk> hunks;
    std::size_t begin = 0;
    std::size_t end = 0; // of the hunk that is being gathered
    for (std::size_t i = 0; i < script.size(); ++i) {
        if (script[i].kind == DiffLine::Kind::common) {
            continue;
        }
        const std::size_t first = i < CONTEXT ? 0 : i - CONTEXT;
        if (end != 0 && first > end) {
            hunks.push_back(hunkOf(script, begin, end));
            end = 0;
        }
        begin = end == 0 ? first : begin;
        end = std::min(i + 1 + CONTEXT, script.size());
    }
    hunks.push_back(hunkOf(script, begin, end));
    return hunks;
}

} // namespace orvane::desk
