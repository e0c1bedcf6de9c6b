// SPDX-License-Identifier: Apache-2.0
//
// The difference of two texts, line by line.
#pragma once

#include <cstddef>
#include <string>
#include <vector>

namespace orvane::desk {

struct DiffLine {
    enum class Kind { common, removed, added };
    Kind kind = Kind::common;
    std::string text;       ///< with its line end, if it has one
    std::size_t before = 0; ///< its number in the first text, from 1; 0 for an added line
    std::size_t after = 0;  ///< its number in the second text, from 1; 0 for a removed line
};

/// Changed lines and some common ones around them.
struct Hunk {
    std::size_t before = 0; ///< its first line in each text; without one, the line above
    std::size_t beforeCount = 0;
    std::size_t after = 0;
    std::size_t afterCount = 0;
    std::vector<DiffLine> lines;
};

std::vector<Hunk> differingHunks(const std::string& before, const std::string& after);

} // namespace orvane::desk
