// SPDX-License-Identifier: Apache-2.0
//
// Which output lines an input changes, found by changing it in a copy of the unit.
#pragma once

#include "kit/description/value_key.h"

#include <cstddef>
#include <filesystem>
#include <functional>
#include <set>
#include <string>
#include <vector>

namespace orvane::desk {

/// A line of an output.
struct OutputLine {
    std::string path;
    std::size_t number = 0; ///< from 1; 0 for the whole output
};

/// Ordered by path, then number.
bool operator<(const OutputLine& one, const OutputLine& other);

struct Impact {
    kit::ValueKey key;        ///< of a parameter, a byte of a slot or a tuning field
    std::size_t tried = 0;    ///< other values that were tried
    std::size_t changing = 0; ///< of these, how many changed a line
    std::set<OutputLine> lines;
};

/// Called with the number of inputs that are done, and of all.
using Progress = std::function<void(std::size_t done, std::size_t all)>;

/// Tries every parameter, slot byte and tuning field of the unit at `root`, which is only read; of
/// these, if there are `prefixes`, only those whose key as a text begins with one of them. Throws
/// kit::KitError when the unit can't be read, no copy can be made, or a prefix is that of no key.
std::vector<Impact> findImpacts(const std::filesystem::path& root,
                                const std::vector<std::string>& prefixes, const Progress& progress);

} // namespace orvane::desk
