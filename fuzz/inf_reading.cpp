// SPDX-License-Identifier: Apache-2.0
#include "fuzz/inf_reading.h"

#include <algorithm>
#include <array>
#include <cstdint>
#include <cstdio>
#include <limits>

namespace orvane::fuzz {

namespace {

/// A key and a value, built character by character.
struct Line {
    std::string key;
    std::string value;
    bool hasEquals = false;

    void add(char character) {
        if (hasEquals) {
            value += character;
        } else if (character == '=') {
            hasEquals = true;
        } else {
            key += character;
        }
    }
};

void enter(PlainRecord& record, const Line& line) {
    if (!line.hasEquals || line.value.empty()) {
        return;
    }
    const std::string key = plainTrim(line.key);
    const std::string value = plainTrim(line.value);
    for (auto& entry : record) {
        if (entry.first == key) {
            entry.second = value;
            return;
        }
    }
    record.emplace_back(key, value);
}

bool bytewiseLess(const std::string& left, const std::string& right) {
    return std::lexicographical_compare(
        left.begin(), left.end(), right.begin(), right.end(), [](char one, char other) {
            return static_cast<unsigned char>(one) < static_cast<unsigned char>(other);
        });
}

/// The parts before and after the first `separator`; without one, the whole text twice.
std::pair<std::string, std::string> splitOrRepeat(const std::string& text, char separator) {
    std::string before;
    for (std::size_t at = 0; at < text.size(); ++at) {
        if (text[at] == separator) {
            return {before, text.substr(at + 1)};
        }
        before += text[at];
    }
    return {text, text};
}

/// Of the "C" locale.
bool isWhiteSpace(char character) {
    return character == ' ' || (character >= '\t' && character <= '\r');
}

/// A number as a formatted extraction of an int reads it: out of range, it becomes the nearest;
/// anything that is not a number becomes 0.
std::int64_t leadingNumber(const std::string& text) {
    std::size_t at = 0;
    while (at < text.size() && isWhiteSpace(text[at])) {
        ++at;
    }
    bool isNegative = false;
    if (at < text.size() && (text[at] == '-' || text[at] == '+')) {
        isNegative = text[at] == '-';
        ++at;
    }
    constexpr std::int64_t LARGEST = std::numeric_limits<std::int32_t>::max();
    std::int64_t magnitude = 0;
    for (; at < text.size() && text[at] >= '0' && text[at] <= '9'; ++at) {
        magnitude = std::min(magnitude * 10 + (text[at] - '0'), LARGEST + 1);
    }
    return isNegative ? -magnitude : std::min(magnitude, LARGEST);
}

} // namespace

std::string plainTrim(const std::string& text) {
    std::string rest = text;
    while (!rest.empty() && rest.front() == ' ') {
        rest.erase(0, 1);
    }
    while (!rest.empty() && rest.back() == ' ') {
        rest.pop_back();
    }
    return rest;
}

PlainRecord plainRead(const std::string& text) {
    PlainRecord record;
    Line line;
    for (const char character : text) {
        if (character == '\n') {
            enter(record, line);
            line = Line();
        } else {
            line.add(character);
        }
    }
    enter(record, line); // the last line needs no end
    std::sort(record.begin(), record.end(), [](const auto& left, const auto& right) {
        return bytewiseLess(left.first, right.first);
    });
    return record;
}

std::string plainValue(const PlainRecord& record, const std::string& key) {
    for (const auto& entry : record) {
        if (entry.first == key) {
            return entry.second;
        }
    }
    return "";
}

std::string plainSelect(const std::vector<PlainRecord>& records) {
    for (const PlainRecord& record : records) {
        if (plainValue(record, "Type").find("Application") != std::string::npos) {
            return splitOrRepeat(plainValue(record, "Version Number"), '_').second;
        }
    }
    return "";
}

std::string plainFormat(const std::string& version) {
    if (version.empty() || version == "N/A") {
        return "000000";
    }
    const auto [first, afterFirst] = splitOrRepeat(version, '.');
    const auto [second, afterSecond] = splitOrRepeat(afterFirst, '.');
    const std::string third = splitOrRepeat(afterSecond, '_').first;
    return plainFormatByte(first) + plainFormatByte(second) + plainFormatByte(third);
}

std::string plainFormatByte(const std::string& component) {
    std::array<char, sizeof "ffffffff"> digits{};
    const auto value = static_cast<std::uint32_t>(leadingNumber(component) % 256);
    (void)std::snprintf(digits.data(), digits.size(), "%02x", value);
    return digits.data();
}

} // namespace orvane::fuzz
