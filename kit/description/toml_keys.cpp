// SPDX-License-Identifier: Apache-2.0
#include "kit/description/toml_keys.h"

#include "kit/host/kit_error.h"

#include <algorithm>
#include <cstddef>

namespace orvane::kit {

namespace {

/// Where the text goes on after the string that begins at `begin` with its quote. A string of one
/// quote ends with its line at the latest.
std::size_t endOfString(std::string_view text, std::size_t begin) {
    const char quote = text[begin];
    const std::string three(3, quote);
    const bool isLong = text.substr(begin, 3) == three;
    std::size_t at = begin + (isLong ? 3 : 1);
    while (at < text.size()) {
        if (isLong && text.substr(at, 3) == three) {
            return std::min(text.find_first_not_of(quote, at), text.size()); // quotes may precede
        }
        if (!isLong && (text[at] == quote || text[at] == '\n')) {
            return at + 1;
        }
        at += quote == '"' && text[at] == '\\' ? 2U : 1U;
    }
    return text.size();
}

/// "line:column" of a place in the text; columns count characters.
std::string placeText(std::string_view text, std::size_t place) {
    const std::string_view before = text.substr(0, place);
    const auto lines = std::count(before.begin(), before.end(), '\n');
    const std::string_view line = before.substr(before.rfind('\n') + 1);
    const auto characters = std::count_if(line.begin(), line.end(), [](char c) {
        return (static_cast<unsigned char>(c) & 0xC0U) != 0x80U; // not inside a UTF-8 sequence
    });
    return std::to_string(lines + 1) + ":" + std::to_string(characters + 1);
}

} // namespace

void requireShortKeys(std::string_view text, const std::string& name) {
    constexpr std::string_view BETWEEN_KEYS = "\n=,[]{}";
    int parts = 1;
    for (std::size_t at = 0; at < text.size();) {
        const char c = text[at];
        if (c == '"' || c == '\'') {
            at = endOfString(text, at);
            continue;
        }
        if (c == '#') {
            at = std::min(text.find('\n', at), text.size());
            continue;
        }
        if (BETWEEN_KEYS.find(c) != std::string_view::npos) {
            parts = 1;
        } else if (c == '.' && ++parts > MOST_KEY_PARTS) {
            throw KitError(name + ":" + placeText(text, at) + ": a key has more than " +
                           std::to_string(MOST_KEY_PARTS) + " parts");
        }
        ++at;
    }
}

} // namespace orvane::kit
