// SPDX-License-Identifier: Apache-2.0
//
// The texts inside a description that have a form of their own. Each function throws KitError with
// what is wrong and what would be right; where, the caller knows.
#pragma once

#include "kit/unit.h"

#include <cstdint>
#include <string>
#include <string_view>

namespace orvane::kit {

/// The bytes of a hex text: two digits a byte, blanks and line ends ignored.
Bytes hexBytes(std::string_view text);

/// The bytes of a text that is taken as it is, or in hex when it begins with "hex:".
Bytes textOrHexBytes(std::string_view text);

/// A number that stands as a key: decimal, or hex after "0x", from 0 to `greatest`. `what` names it
/// in the error.
std::uint64_t keyNumber(std::string_view key, std::uint64_t greatest, const std::string& what);

} // namespace orvane::kit
