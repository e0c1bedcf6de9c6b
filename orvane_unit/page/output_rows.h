// SPDX-License-Identifier: Apache-2.0
//
// The pieces of an output as lines of text, to be shown one below the other.
#pragma once

#include "orvane_unit/explain/explanation.h"
#include "orvane_unit/explain/reasons.h"

#include <cstddef>
#include <set>
#include <string>
#include <vector>

namespace orvane::desk {

/// A line of an output, or the part of one that has an origin of its own.
struct OutputRow {
    std::size_t number = 0; ///< of the line, from 1
    std::string text;       ///< without its line end
    bool hasEnd = false;    ///< whether its line ends here
    bool isLeftOut = false; ///< stands where lines would be that were left out
    const Origin* origin = nullptr;
};

/// The rows of `lines`, which must outlive them. Their texts and line ends, in order, are the
/// content of the output.
std::vector<OutputRow> outputRows(const std::vector<Line>& lines);

/// Why a piece is what it is, in words, and where its value lies. What is intended and has a place
/// is said in words only once: `said` holds the reasons that were.
std::string originText(const Origin& origin, std::set<Reason>& said);

} // namespace orvane::desk
