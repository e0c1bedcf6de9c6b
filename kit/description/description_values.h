// SPDX-License-Identifier: Apache-2.0
//
// The texts in a description that have a format of their own. Each function throws KitError with
// what is wrong and what would be right; the caller knows where.
#pragma once

#include "kit/host/bytes.h"

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace orvane::kit {

/// The prefix of a text in hex.
constexpr std::string_view HEX_PREFIX = "hex:";
bool hasHexPrefix(std::string_view text);

/// The bytes of a hex text: two digits a byte, blanks and line ends ignored.
Bytes hexBytes(std::string_view text);

/// The bytes of a text: those of the hex after "hex:", else the text itself.
Bytes textOrHexBytes(std::string_view text);

/// The number in `text`, decimal or hex after "0x"; the greatest for one that is too great. Nothing
/// for any other text.
std::optional<std::uint64_t> wholeNumber(std::string_view text);

/// The numbers that a key may be.
struct KeyRange {
    std::uint64_t least;
    std::uint64_t greatest;
};

/// The number in `key`, decimal or hex after "0x"; it must be in `range`. `what` names it in the
/// error.
std::uint64_t keyNumber(std::string_view key, KeyRange range, const std::string& what);

} // namespace orvane::kit
