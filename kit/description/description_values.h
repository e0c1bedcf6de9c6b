// SPDX-License-Identifier: Apache-2.0
//
// The texts inside a description that have a form of their own. Each function throws KitError with
// what is wrong and what would be right; where, the caller knows.
#pragma once

#include "kit/host/bytes.h"

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace orvane::kit {

/// What a text begins with whose rest is hex.
constexpr std::string_view HEX_PREFIX = "hex:";
bool hasHexPrefix(std::string_view text);

/// The bytes of a hex text: two digits a byte, blanks and line ends ignored.
Bytes hexBytes(std::string_view text);

/// The bytes of a text that is taken as it is, or in hex when it begins with "hex:".
Bytes textOrHexBytes(std::string_view text);

/// The number that `text` is: decimal, or hex after "0x"; where it is too great, the greatest.
/// Nothing for any other text.
std::optional<std::uint64_t> wholeNumber(std::string_view text);

/// The numbers that may stand as a key.
struct KeyRange {
    std::uint64_t least;
    std::uint64_t greatest;
};

/// A number that stands as a key: decimal, or hex after "0x", in `range`. `what` names it in the
/// error.
std::uint64_t keyNumber(std::string_view key, KeyRange range, const std::string& what);

} // namespace orvane::kit
