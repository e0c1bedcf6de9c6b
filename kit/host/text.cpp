// SPDX-License-Identifier: Apache-2.0
#include "kit/host/text.h"

#include <utf8.h>

#include <algorithm>
#include <cstddef>
#include <iterator>

namespace orvane::kit {

namespace {

std::string hexByte(char byte) {
    return hexDigits(static_cast<unsigned char>(byte), 2);
}

/// Characters from `first` to `last`.
struct Range {
    char32_t first;
    char32_t last;
};

/// The categories Cc, Cf, Zl and Zp of Unicode 15: control and format characters, line and
/// paragraph separators.
constexpr Range UNPRINTABLE[] = {
    {0x0, 0x1F},        {0x7F, 0x9F},       {0xAD, 0xAD},       {0x600, 0x605},
    {0x61C, 0x61C},     {0x6DD, 0x6DD},     {0x70F, 0x70F},     {0x890, 0x891},
    {0x8E2, 0x8E2},     {0x180E, 0x180E},   {0x200B, 0x200F},   {0x2028, 0x202E},
    {0x2060, 0x2064},   {0x2066, 0x206F},   {0xFEFF, 0xFEFF},   {0xFFF9, 0xFFFB},
    {0x110BD, 0x110BD}, {0x110CD, 0x110CD}, {0x13430, 0x1343F}, {0x1BCA0, 0x1BCA3},
    {0x1D173, 0x1D17A}, {0xE0001, 0xE0001}, {0xE0020, 0xE007F},
};

/// The escapes of a character that has its own.
const char* ownEscape(char32_t character) {
    return character == U'\n' ? "\\n" : character == U'\\' ? "\\\\" : nullptr;
}

} // namespace

bool isUtf8(std::string_view text) {
    return utf8::is_valid(text.begin(), text.end());
}

bool isPrintable(char32_t character) {
    if (character >= U' ' && character <= U'~') { // most are, and texts can be long
        return true;
    }
    return std::none_of(std::begin(UNPRINTABLE), std::end(UNPRINTABLE), [character](Range range) {
        return range.first <= character && character <= range.last;
    });
}

void forEachCharacter(std::string_view text,
                      const std::function<void(char32_t, std::string_view)>& take) {
    const char* const end = text.data() + text.size();
    for (const char* at = text.data(); at != end;) {
        const char* const begin = at;
        const char32_t character = utf8::unchecked::next(at);
        take(character, {begin, static_cast<std::size_t>(at - begin)});
    }
}

std::string printable(std::string_view bytes) {
    std::string text;
    const auto escape = [&text](std::string_view part) {
        std::for_each(part.begin(), part.end(),
                      [&text](char byte) { text += "\\x" + hexByte(byte); });
    };
    while (!bytes.empty()) {
        const auto valid = static_cast<std::size_t>(utf8::find_invalid(bytes.begin(), bytes.end()) -
                                                    bytes.begin());
        forEachCharacter(bytes.substr(0, valid), [&](char32_t character, std::string_view part) {
            if (const char* const own = ownEscape(character)) {
                text += own;
            } else if (isPrintable(character)) {
                text += part;
            } else {
                escape(part);
            }
        });
        bytes.remove_prefix(valid);
        escape(bytes.substr(0, 1));
        bytes.remove_prefix(std::min<std::size_t>(1, bytes.size()));
    }
    return text;
}

std::string printableLines(std::string_view bytes) {
    std::string text;
    while (!bytes.empty()) {
        const std::size_t end = std::min(bytes.find_first_of("\n\t"), bytes.size());
        text += printable(bytes.substr(0, end));
        text += bytes.substr(end, 1);
        bytes.remove_prefix(std::min(end + 1, bytes.size()));
    }
    return text;
}

std::string hexDigits(std::uint32_t number, unsigned count) {
    std::string text(count, '0');
    for (auto digit = text.rbegin(); digit != text.rend(); ++digit, number >>= 4U) {
        *digit = "0123456789abcdef"[number & 0xFU];
    }
    return text;
}

std::string unicodeEscape(char32_t unit) {
    return "\\u" + hexDigits(unit, 4);
}

std::string hexText(std::string_view bytes) {
    std::string text;
    text.reserve(bytes.size() * 3);
    for (const char byte : bytes) {
        if (!text.empty()) {
            text += ' ';
        }
        text += hexByte(byte);
    }
    return text;
}

std::string inQuotes(std::string_view text) {
    return "\"" + std::string(text) + "\"";
}

std::string counted(std::uint64_t count, const std::string& thing) {
    return std::to_string(count) + " " + thing + (count == 1 ? "" : "s");
}

} // namespace orvane::kit
