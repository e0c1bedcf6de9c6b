// SPDX-License-Identifier: Apache-2.0
//
// The ids to which links lead.
#pragma once

#include <cstddef>
#include <string>

namespace orvane::desk {

/// Of the unit with an index.
inline std::string unitId(std::size_t index) {
    return "unit-" + std::to_string(index + 1);
}

/// Of an output with an index, in the unit with the id `unit`.
inline std::string outputId(const std::string& unit, std::size_t index) {
    return unit + "-output-" + std::to_string(index + 1);
}

} // namespace orvane::desk
