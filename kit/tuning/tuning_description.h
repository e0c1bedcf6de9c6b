// SPDX-License-Identifier: Apache-2.0
//
// What a description says about a tuning block.
#pragma once

#include "kit/host/bytes.h"

#include <cstdint>
#include <map>
#include <string>
#include <variant>
#include <vector>

namespace orvane::kit {

/// A value of one tuning field: a word ("qwaOn"), a number or a list of numbers.
using TuningValue = std::variant<std::string, std::int64_t, std::vector<std::int64_t>>;

/// One tuning block: raw bytes first (zeros where none are given), then the named fields over them.
struct TuningDescription {
    Bytes raw;                                 ///< at most 188 bytes
    std::map<std::string, TuningValue> fields; ///< by key, as in a tuning file
};

} // namespace orvane::kit
