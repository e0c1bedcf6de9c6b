// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <string_view>

namespace orvane::kit {

/// The most parts of a dotted key. The keys of a description have at most four.
constexpr int MOST_KEY_PARTS = 16;

/// Throws KitError, with "name:line:column:" in front, when a key of the TOML text has more parts:
/// the library's tree would be so deep that its removal overflows the stack. Any text will do; one
/// that is not TOML may be refused at another place than where the library refuses it.
void requireShortKeys(std::string_view text, const std::string& name);

} // namespace orvane::kit
