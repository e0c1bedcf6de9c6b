// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/explain/value_lines.h"

#include "kit/description/value_key.h"

#include <algorithm>
#include <iterator>
#include <stdexcept>
#include <utility>
#include <variant>

namespace orvane::desk {

namespace {

/// What differs: [begin, end) of the text, [begin, changedEnd) of the changed one.
struct Difference {
    std::size_t begin;
    std::size_t end;
    std::size_t changedEnd;
};

Difference differenceOf(const std::string& text, const std::string& changed, const Origin& origin) {
    if (text == changed) {
        throw std::logic_error("error in orvane-unit: no line carries " + keyText(origin.key));
    }
    const std::size_t shorter = std::min(text.size(), changed.size());
    const auto begin = static_cast<std::size_t>(std::distance(
        text.begin(),
        std::mismatch(text.begin(), text.begin() + static_cast<std::ptrdiff_t>(shorter),
                      changed.begin())
            .first));
    std::size_t same = 0;
    while (same < shorter - begin &&
           text[text.size() - same - 1] == changed[changed.size() - same - 1]) {
        ++same;
    }
    return {begin, text.size() - same, changed.size() - same};
}

std::size_t lineBegin(const std::string& text, std::size_t at) {
    return at == 0 ? 0 : text.rfind('\n', at - 1) + 1; // npos + 1 is 0
}

std::size_t lineEnd(const std::string& text, std::size_t at) {
    return std::min(text.find('\n', at), text.size() - 1) + 1;
}

void addFixedLines(std::vector<Line>& lines, const std::string& text, std::size_t from,
                   std::size_t to) {
    while (from < to) {
        const std::size_t next = std::min(lineEnd(text, from), to);
        lines.push_back({text.substr(from, next - from), fixedText()});
        from = next;
    }
}

} // namespace

ValueRegion changedBytes(const std::string& text, const std::string& changed, Origin origin) {
    const Difference difference = differenceOf(text, changed, origin);
    return {difference.begin, difference.end, std::move(origin)};
}

ValueRegion changedLines(const std::string& text, const std::string& changed, Origin origin) {
    const Difference difference = differenceOf(text, changed, origin);
    const std::size_t begin = lineBegin(text, difference.begin);
    const auto more = changed.substr(difference.begin, difference.changedEnd - difference.begin);
    const bool isLeftOut =
        difference.begin == difference.end && more.find('\n') != std::string::npos;
    return {begin, isLeftOut ? begin : lineEnd(text, difference.end), std::move(origin)};
}

std::vector<Line> cutIntoLines(const std::string& text, std::vector<ValueRegion> regions) {
    std::stable_sort(
        regions.begin(), regions.end(),
        [](const ValueRegion& one, const ValueRegion& other) { return one.begin < other.begin; });
    std::vector<Line> lines;
    std::size_t done = 0;
    for (std::size_t i = 0; i < regions.size(); ++i) {
        const std::size_t begin = std::max(regions[i].begin, done);
        const std::size_t next = i + 1 < regions.size() ? regions[i + 1].begin : text.size();
        const std::size_t end = std::max(begin, std::min(regions[i].end, next));
        addFixedLines(lines, text, done, begin);
        lines.push_back({text.substr(begin, end - begin), std::move(regions[i].origin)});
        done = end;
    }
    addFixedLines(lines, text, done, text.size());
    return lines;
}

std::string otherText(const std::string& text) {
    // A value may end before the last byte of its text, so a letter that is not in it is preferred.
    for (char letter = 'a'; letter <= 'z'; ++letter) {
        if (text.find(letter) == std::string::npos) {
            return {letter};
        }
    }
    for (const char letter : {'a', 'b'}) {
        if (text.front() != letter && text.back() != letter) {
            return {letter};
        }
    }
    return "c";
}

} // namespace orvane::desk
