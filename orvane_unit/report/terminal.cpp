// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/report/terminal.h"

#include <unistd.h>
#include <utf8.h>

#include <algorithm>
#include <cstdlib>

namespace orvane::desk {

namespace {

const char* escapeOf(Colour colour) {
    switch (colour) {
    case Colour::good:
    case Colour::added:
        return "\033[32m";
    case Colour::bad:
    case Colour::removed:
        return "\033[31m";
    case Colour::place:
        return "\033[36m";
    case Colour::faint:
        return "\033[2m";
    case Colour::plain:
        break;
    }
    return "";
}

std::string escaped(char byte) {
    constexpr char DIGITS[] = "0123456789abcdef";
    const auto value = static_cast<unsigned char>(byte);
    return {'\\', 'x', DIGITS[value >> 4U], DIGITS[value & 0xFU]};
}

bool isControl(char32_t character) {
    return character < 0x20U || (character >= 0x7FU && character < 0xA0U);
}

} // namespace

bool hasColours() {
    const char* noColour = std::getenv("NO_COLOR");
    return (noColour == nullptr || *noColour == '\0') && ::isatty(STDOUT_FILENO) == 1;
}

std::string painted(Colour colour, const std::string& text) {
    static const bool ARE_COLOURS = hasColours();
    return ARE_COLOURS && colour != Colour::plain ? escapeOf(colour) + text + "\033[0m" : text;
}

std::string printable(const std::string& bytes) {
    std::string text;
    for (auto at = bytes.begin(); at != bytes.end();) {
        const auto valid = utf8::find_invalid(at, bytes.end());
        while (at != valid) {
            const auto begin = at;
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
        if (at != bytes.end()) {
            text += escaped(*at++);
        }
    }
    return text;
}

std::string counted(std::uint64_t count, const std::string& thing) {
    return std::to_string(count) + " " + thing + (count == 1 ? "" : "s");
}

} // namespace orvane::desk
