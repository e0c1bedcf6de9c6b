// SPDX-License-Identifier: Apache-2.0
//
// Which output lines an input moves, found out by changing it in a copy of the unit.
#pragma once

#include <cstddef>
#include <filesystem>
#include <functional>
#include <set>
#include <string>
#include <vector>

namespace orvane::desk {

struct Impact {
    std::string key;        ///< "param.139", "slot.9.0" for a byte of a slot, "tuning.3.qwaNRAtten"
    std::size_t tried = 0;  ///< other values that were tried
    std::size_t moving = 0; ///< of these, how many moved a line
    std::set<std::string> lines; ///< "/tmp/airplay.conf:5"; "/tmp/airplay.conf" for a whole output
};

/// Calls for how many of how many inputs are done.
using Progress = std::function<void(std::size_t done, std::size_t all)>;

/// Tries every parameter, slot byte and tuning field of the unit at `root`, which is only read; of
/// these, where `beginnings` is not empty, only those whose key begins with one of them. Throws
/// kit::KitError when the unit can't be read, no copy can be made, or no input begins so.
std::vector<Impact> findImpacts(const std::filesystem::path& root,
                                const std::vector<std::string>& beginnings,
                                const Progress& progress);

} // namespace orvane::desk
