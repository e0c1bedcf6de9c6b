// SPDX-License-Identifier: Apache-2.0
#include "kit/description/description_values.h"

#include "kit/host/kit_error.h"
#include "kit/host/text.h"

#include <charconv>
#include <cstddef>
#include <limits>
#include <system_error>

namespace orvane::kit {

namespace {

/// The most bytes of a text that an error shows.
constexpr std::size_t SHOWN = 40;

} // namespace

Bytes hexBytes(std::string_view text) {
    std::string digits;
    for (const char c : text) {
        if (std::string_view(" \t\r\n").find(c) == std::string_view::npos) {
            digits += c;
        }
    }
    if (digits.size() % 2 != 0) {
        throw KitError("hex needs two digits a byte: " + inQuotes(digits.substr(0, SHOWN)) +
                       (digits.size() > SHOWN ? "..." : "") + " has an odd number");
    }
    Bytes bytes;
    for (std::size_t i = 0; i < digits.size(); i += 2) {
        const char* const pair = digits.data() + i;
        unsigned byte = 0;
        const auto [end, error] = std::from_chars(pair, pair + 2, byte, 16);
        if (error != std::errc{} || end != pair + 2) {
            throw KitError("hex has the digits 0-9 and a-f: " +
                           inQuotes(std::string_view(pair, 2)) + " is not a byte");
        }
        bytes += static_cast<char>(byte);
    }
    return bytes;
}

bool hasHexPrefix(std::string_view text) {
    return text.substr(0, HEX_PREFIX.size()) == HEX_PREFIX;
}

Bytes textOrHexBytes(std::string_view text) {
    if (hasHexPrefix(text)) {
        return hexBytes(text.substr(HEX_PREFIX.size()));
    }
    return Bytes(text);
}

std::optional<std::uint64_t> wholeNumber(std::string_view text) {
    const bool isHex = text.substr(0, 2) == "0x";
    const std::string_view digits = isHex ? text.substr(2) : text;
    const char* const last = digits.data() + digits.size();
    std::uint64_t number = 0;
    const auto [end, error] = std::from_chars(digits.data(), last, number, isHex ? 16 : 10);
    if (error == std::errc::invalid_argument || end != last) {
        return std::nullopt;
    }
    return error == std::errc{} ? number : std::numeric_limits<std::uint64_t>::max();
}

std::uint64_t keyNumber(std::string_view key, KeyRange range, const std::string& what) {
    const std::optional<std::uint64_t> number = wholeNumber(key);
    if (!number || *number < range.least || *number > range.greatest) {
        throw KitError(what + " must be from " + std::to_string(range.least) + " to " +
                       std::to_string(range.greatest) + ", not " + inQuotes(key));
    }
    return *number;
}

} // namespace orvane::kit
