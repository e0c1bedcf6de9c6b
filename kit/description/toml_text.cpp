// SPDX-License-Identifier: Apache-2.0
#include "kit/description/toml_text.h"

#include "kit/description/description_values.h"
#include "kit/host/text.h"

#include <algorithm>
#include <cstddef>

namespace orvane::kit {

namespace {

constexpr std::size_t HEX_LINE = 32; ///< bytes
constexpr char DIGITS[] = "0123456789abcdef";

bool isControl(char c) {
    return static_cast<unsigned char>(c) < 0x20 || c == 0x7F;
}

std::string escaped(char c) {
    switch (c) {
    case '\n':
        return "\\n";
    case '\r':
        return "\\r";
    case '\t':
        return "\\t";
    case '"':
    case '\\':
        return std::string("\\") + c;
    default:
        break;
    }
    const auto byte = static_cast<unsigned char>(c);
    return std::string("\\u00") + DIGITS[byte >> 4U] + DIGITS[byte & 0xFU];
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
    const auto unreadable = std::count_if(text.begin(), text.end(), [](char c) {
        return isControl(c) && c != '\n' && c != '\t' && c != '\r';
    });
    return static_cast<std::size_t>(unreadable) * 8 <= text.size() && isUtf8(text);
}

std::string tomlText(std::string_view text) {
    std::string result = "\"";
    for (const char c : text) {
        result += isControl(c) || c == '"' || c == '\\' ? escaped(c) : std::string(1, c);
    }
    return result + '"';
}

std::string tomlLines(std::string_view text) {
    const std::size_t end = text.find('\n');
    if (end == std::string_view::npos || end + 1 == text.size()) {
        return tomlText(text);
    }
    std::string result = "\"\"\"\n"; // the first line end is not part of the text
    for (std::size_t at = 0; at < text.size(); ++at) {
        const char c = text[at];
        // A quote needs an escape only next to another one and before the three at the end.
        const bool isPlainQuote = c == '"' && result.back() != '"' && at + 1 < text.size();
        const bool isPlain =
            c == '\n' || c == '\t' || isPlainQuote || (!isControl(c) && c != '"' && c != '\\');
        result += isPlain ? std::string(1, c) : escaped(c);
    }
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
