// SPDX-License-Identifier: Apache-2.0
#include "kit/description/toml_text.h"

#include "kit/description/description_values.h"
#include "kit/host/text.h"

#include <cstddef>

namespace orvane::kit {

namespace {

constexpr std::size_t HEX_LINE = 32; ///< bytes

/// The character as an escape of a basic string.
std::string escaped(char32_t character) {
    switch (character) {
    case U'\n':
        return "\\n";
    case U'\r':
        return "\\r";
    case U'\t':
        return "\\t";
    case U'"':
        return "\\\"";
    case U'\\':
        return "\\\\";
    default:
        break;
    }
    return character <= 0xFFFFU ? unicodeEscape(character) : "\\U" + hexDigits(character, 8);
}

/// Whether the character stands for itself in a basic string, where nothing is before or after it.
bool isPlain(char32_t character) {
    return isPrintable(character) && character != U'"' && character != U'\\';
}

/// `bytes` in hex, on one or more lines.
std::string hexLines(std::string_view bytes) {
    if (bytes.size() <= HEX_LINE) {
        return hexText(bytes);
    }
    std::string text = "\n";
    for (std::size_t begin = 0; begin < bytes.size(); begin += HEX_LINE) {
        text += hexText(bytes.substr(begin, HEX_LINE)) + '\n';
    }
    return text;
}

std::string betweenQuotes(const std::string& text) {
    const std::string quotes = text.find('\n') == std::string::npos ? "\"" : R"(""")";
    return quotes + text + quotes;
}

} // namespace

bool isReadable(std::string_view text) {
    if (!isUtf8(text)) {
        return false;
    }
    std::size_t unreadable = 0;
    forEachCharacter(text, [&unreadable](char32_t character, std::string_view /*bytes*/) {
        const bool isLayout = character == U'\n' || character == U'\t' || character == U'\r';
        unreadable += isPrintable(character) || isLayout ? 0U : 1U;
    });
    return unreadable * 8 <= text.size();
}

std::string tomlText(std::string_view text) {
    std::string result = "\"";
    forEachCharacter(text, [&result](char32_t character, std::string_view bytes) {
        result += isPlain(character) ? std::string(bytes) : escaped(character);
    });
    return result + '"';
}

std::string tomlLines(std::string_view text) {
    const std::size_t end = text.find('\n');
    if (end == std::string_view::npos || end + 1 == text.size()) {
        return tomlText(text);
    }
    std::string result = "\"\"\"\n"; // the first line end is not part of the text
    std::size_t rest = text.size();
    forEachCharacter(text, [&result, &rest](char32_t character, std::string_view bytes) {
        rest -= bytes.size();
        // A quote needs an escape only next to another one and before the three at the end.
        const bool isPlainQuote = character == U'"' && result.back() != '"' && rest != 0;
        const bool isLayout = character == U'\n' || character == U'\t';
        result += isPlain(character) || isPlainQuote || isLayout ? std::string(bytes)
                                                                 : escaped(character);
    });
    return result + R"(""")";
}

std::string tomlHex(std::string_view bytes) {
    return betweenQuotes(hexLines(bytes));
}

std::string tomlTextOrHex(std::string_view bytes) {
    return isReadable(bytes) && !hasHexPrefix(bytes)
               ? tomlText(bytes)
               : betweenQuotes(std::string(HEX_PREFIX) + hexLines(bytes));
}

std::string tomlPath(std::string_view path) {
    return isUtf8(path) && !hasHexPrefix(path) ? tomlText(path)
                                               : tomlText(std::string(HEX_PREFIX) + hexText(path));
}

} // namespace orvane::kit
