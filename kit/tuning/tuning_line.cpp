// SPDX-License-Identifier: Apache-2.0
#include "kit/tuning/tuning_line.h"

#include "kit/host/text.h"
#include "kit/tuning/tuning_description.h"
#include "kit/tuning/tuning_encode.h"

#include <array>
#include <charconv>
#include <cstdint>
#include <system_error>
#include <vector>

namespace orvane::kit {

namespace {

struct FaultyLine {
    LineFault fault;
};

[[noreturn]] void fail(std::size_t column, const std::string& what) {
    throw FaultyLine{{column, what}};
}

/// A number as the tool writes it: no plus, no leading zeros, no minus before a zero.
std::int64_t numberAt(std::string_view text, std::size_t column, const DpsField& field) {
    std::int32_t number = 0;
    const char* const last = text.data() + text.size();
    const auto [end, error] = std::from_chars(text.data(), last, number);
    const bool isNumber = !text.empty() && end == last && error != std::errc::invalid_argument;
    if (!isNumber || (error == std::errc{} && std::to_string(number) != text)) {
        fail(column,
             std::string(field.key) + " takes a decimal number, not " + inQuotes(printable(text)));
    }
    if (error != std::errc{} || number < leastOf(field) || number > greatestOf(field)) {
        fail(column, std::string(field.key) + " takes " + std::to_string(leastOf(field)) + " to " +
                         std::to_string(greatestOf(field)) + ": " + std::string(text) +
                         " does not fit");
    }
    return number;
}

TuningValue wordAt(std::string_view text, std::size_t column, const DpsField& field) {
    if (text.empty()) {
        return std::int64_t{0};
    }
    std::string known;
    for (const QwaWord& row : wordsOf(field)) {
        if (text == row.word) {
            return std::int64_t{row.code};
        }
        known += std::string(row.word) + ", ";
    }
    fail(column, std::string(field.key) + " has no word " + inQuotes(printable(text)) +
                     ": it takes " + known + "or nothing");
}

TuningValue listAt(std::string_view text, std::size_t column, const DpsField& field) {
    std::vector<std::int64_t> numbers;
    std::size_t begin = 0;
    while (begin < text.size()) {
        const std::size_t end = text.find(' ', begin);
        numbers.push_back(numberAt(text.substr(begin, end - begin), column + begin, field));
        if (end == std::string_view::npos) {
            fail(column + text.size(),
                 std::string(field.key) + " takes a blank behind its last number, too");
        }
        begin = end + 1;
    }
    if (numbers.size() != field.count) {
        fail(column, std::string(field.key) + " takes " + std::to_string(field.count) +
                         " numbers, not " + std::to_string(numbers.size()));
    }
    return numbers;
}

TuningValue valueAt(std::string_view text, std::size_t column, const DpsField& field) {
    switch (field.kind) {
    case DpsKind::switchWord:
    case DpsKind::modeWord:
        return wordAt(text, column, field);
    case DpsKind::number:
        return numberAt(text, column, field);
    case DpsKind::list:
        break;
    }
    return listAt(text, column, field);
}

} // namespace

LineFault readTuningLine(std::string_view line, const DpsField& field, DpsBlock& block) {
    const std::string key = field.key;
    const std::size_t value = key.size() + 1;
    if (line.size() < value) {
        return {key.size(), key + " takes a blank behind it, whatever follows"};
    }
    try {
        encodeTuningField(block, key, valueAt(line.substr(value), value, field));
    } catch (const FaultyLine& faulty) {
        return faulty.fault;
    }
    return {};
}

} // namespace orvane::kit
