// SPDX-License-Identifier: Apache-2.0
#include "kit/host/text.h"

#include <utf8.h>

#include <algorithm>

namespace orvane::kit {

namespace {

constexpr char DIGITS[] = "0123456789abcdef";

std::string escaped(char byte) {
    const auto value = static_cast<unsigned char>(byte);
    return {'\\', 'x', DIGITS[value >> 4U], DIGITS[value & 0xFU]};
}

bool isControl(char32_t character) {
    return character < 0x20U || (character >= 0x7FU && character < 0xA0U);
}

} // namespace

bool isUtf8(std::string_view text) {
    return utf8::is_valid(text.begin(), text.end());
}

std::string printable(std::string_view bytes) {
    std::string text;
    const char* const end = bytes.data() + bytes.size();
    for (const char* at = bytes.data(); at != end;) {
        const char* const valid = utf8::find_invalid(at, end);
        while (at != valid) {
            const char* const begin = at;
            const char32_t character = utf8::unchecked::next(at);
            if (character == U'\n') {
                text += "\\n";
            } else if (character == U'\\') {
                text += "\\\\";
            } else if (isControl(character)) {
                std::for_each(begin, at, [&text](char byte) { text += escaped(byte); });
            } else {
                text.append(begin, at);
            }
        }
        if (at != end) {
            text += escaped(*at++);
        }
    }
    return text;
}

std::string hexText(std::string_view bytes) {
    std::string text;
    text.reserve(bytes.size() * 3);
    for (const char byte : bytes) {
        const auto value = static_cast<unsigned char>(byte);
        if (!text.empty()) {
            text += ' ';
        }
        text += DIGITS[value >> 4U];
        text += DIGITS[value & 0xFU];
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
