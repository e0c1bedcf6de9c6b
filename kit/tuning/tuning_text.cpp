// SPDX-License-Identifier: Apache-2.0
#include "kit/tuning/tuning_text.h"

#include "kit/host/kit_error.h"
#include "kit/host/text.h"
#include "kit/tuning/tuning_description.h"
#include "kit/tuning/tuning_encode.h"
#include "tuning/tuning_file.h"

#include <algorithm>
#include <charconv>
#include <cstddef>
#include <limits>
#include <optional>
#include <set>
#include <sstream>
#include <string_view>
#include <system_error>
#include <utility>
#include <variant>
#include <vector>

namespace orvane::kit {

namespace {

// A file is read leniently, and the product then writes it again: the first difference is the
// fault. So only the product knows the form of a tuning file.

/// A value that no block can hold.
struct ValueFault {
    std::size_t line = 0;   ///< from 0
    std::size_t column = 0; ///< of the value, from 0
    std::string what;
};

/// What a lenient reader makes of a file.
struct Reading {
    DpsBlock block{};
    std::vector<ValueFault> faults;
};

/// The words of `text` between its blanks.
std::vector<std::string> wordsIn(std::string_view text) {
    std::istringstream in{std::string(text)};
    std::vector<std::string> words;
    for (std::string word; in >> word;) {
        words.push_back(word);
    }
    return words;
}

/// A decimal number; one that is too great for any field becomes the greatest.
std::optional<std::int64_t> numberIn(const std::string& word) {
    std::int64_t number = 0;
    const char* const last = word.data() + word.size();
    const auto [end, error] = std::from_chars(word.data(), last, number);
    if (error == std::errc::invalid_argument || end != last) {
        return std::nullopt;
    }
    using Limits = std::numeric_limits<std::int64_t>;
    return error == std::errc{} ? number : word.front() == '-' ? Limits::min() : Limits::max();
}

/// Sets `field` to the value in `text`, or the nearest that it can hold: the product's text then
/// differs from the file's at the fault. Returns the fault; empty when there is none.
std::string readValue(std::string_view text, const DpsField& field, DpsBlock& block) {
    const bool isList = field.kind == DpsKind::list;
    std::vector<std::int64_t> numbers;
    std::string word; // the first that is not a number
    for (const std::string& part : wordsIn(text)) {
        const std::optional<std::int64_t> number = numberIn(part);
        numbers.push_back(number.value_or(0));
        word = number || !word.empty() ? word : part;
    }
    TuningValue value = numbers;
    if (!word.empty()) {
        value = word;
    } else if (!isList) {
        value = numbers.empty() ? 0 : numbers.front();
    }
    try {
        encodeTuningField(block, field.key, value);
        return "";
    } catch (const KitError& error) {
        numbers.resize(field.count);
        for (std::int64_t& number : numbers) {
            number = std::clamp(number, leastOf(field), greatestOf(field));
        }
        encodeTuningField(block, field.key,
                          isList ? TuningValue(numbers) : TuningValue(numbers.front()));
        return error.text();
    }
}

/// The first line that begins with a key counts.
Reading readLeniently(const std::string& text) {
    Reading reading;
    std::set<std::string> seen;
    std::istringstream lines(text);
    std::size_t number = 0;
    for (std::string line; std::getline(lines, line); ++number) {
        const std::vector<std::string> words = wordsIn(line);
        const std::string key = words.empty() ? "" : words.front();
        if (!isTuningField(key) || !seen.insert(key).second) {
            continue;
        }
        const std::size_t value = line.find(key) + key.size();
        const std::string fault =
            readValue(std::string_view(line).substr(value), tuningField(key), reading.block);
        if (!fault.empty()) {
            reading.faults.push_back({number, value, fault});
        }
    }
    return reading;
}

std::string textOf(const DpsBlock& block, std::int32_t blockId) {
    std::ostringstream text;
    writeTuningText(text, blockId, block);
    return text.str();
}

std::size_t sameBytes(const std::string& one, const std::string& other) {
    return static_cast<std::size_t>(
        std::mismatch(one.begin(), one.end(), other.begin(), other.end()).first - one.begin());
}

/// The tuning file of `block` that agrees longest with `text`: that of `blockId` or of any other
/// block.
std::string nearestFile(const DpsBlock& block, std::int32_t blockId, const std::string& text) {
    std::string nearest = textOf(block, blockId);
    for (std::int32_t id = 0; isTuningBlock(id); ++id) {
        const std::string file = textOf(block, id);
        if (sameBytes(file, text) > sameBytes(nearest, text)) {
            nearest = file;
        }
    }
    return nearest;
}

/// The line of `text` that begins at `begin`, for an error.
std::string shownLine(const std::string& text, std::size_t begin) {
    const std::string line = text.substr(begin, text.find('\n', begin) - begin);
    return line.size() <= DPS_LINE_MAX ? inQuotes(printable(line))
                                       : inQuotes(printable(line.substr(0, DPS_LINE_MAX))) + "...";
}

/// What differs in the line at `begin`, where both texts still have the same bytes before it.
std::string differenceAt(std::size_t begin, const std::string& written, const std::string& found) {
    if (begin == written.size()) {
        return "orvane does not write " + shownLine(found, begin);
    }
    const std::string line = shownLine(written, begin);
    if (begin == found.size()) {
        return "the text ends here: orvane writes " + line;
    }
    return shownLine(found, begin) == line
               ? "the last line has no line end"
               : "orvane writes " + line + " here, not " + shownLine(found, begin);
}

} // namespace

DpsBlock parseTuningText(const std::string& text, const std::string& name, std::int32_t blockId) {
    const Reading reading = readLeniently(text);
    const std::string file = nearestFile(reading.block, blockId, text);
    if (file == text) {
        return reading.block;
    }
    const std::size_t place = sameBytes(text, file);
    const auto lines = static_cast<std::size_t>(
        std::count(text.begin(), text.begin() + static_cast<std::ptrdiff_t>(place), '\n'));
    const std::size_t begin = lines == 0 ? 0 : text.rfind('\n', place - 1) + 1;
    std::string what = differenceAt(begin, file, text);
    for (const ValueFault& fault : reading.faults) {
        if (fault.line == lines && begin + fault.column <= place) {
            what = fault.what;
        }
    }
    throw KitError(name + ":" + std::to_string(lines + 1) + ":" +
                   std::to_string(place - begin + 1) + ": " + what);
}

} // namespace orvane::kit
