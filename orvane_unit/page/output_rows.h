// SPDX-License-Identifier: Apache-2.0
//
// The pieces of an output as lines of text, to be shown one below the other.
#pragma once

#include "orvane_unit/explain/explanation.h"
#include "orvane_unit/explain/reasons.h"

#include <cstddef>
#include <set>
#include <string>
#include <string_view>
#include <vector>

namespace orvane::desk {

/// A line of an output, or the part of one that has an origin of its own.
struct OutputRow {
    std::size_t number = 0; ///< of the line, from 1
    std::string_view text;  ///< without its line end
    bool hasEnd = false;    ///< whether its line ends here
    bool isLeftOut = false; ///< stands where lines would be that were left out
    const Origin* origin = nullptr;

    /// Its part of the output, in bytes.
    std::size_t size() const { return text.size() + (hasEnd ? 1 : 0); }
};

/// The rows of an output, one by one: there may be millions. Their texts and line ends, in order,
/// are the content of the output.
class OutputRows {
public:
    /// `lines` must outlive this and the rows.
    explicit OutputRows(const std::vector<Line>& lines) : lines_(lines) {}

    /// Sets `row` to the next one. False at the end; `row` is then unchanged.
    bool next(OutputRow& row);

private:
    const std::vector<Line>& lines_;
    std::size_t index_ = 0; ///< of the piece that is read
    std::size_t at_ = 0;    ///< where in it, in bytes
    std::size_t number_ = 1;
};

/// Why a piece is what it is, in words, and where its value lies. What is intended and has a place
/// is said in words only once: `said` holds the reasons that were.
std::string originText(const Origin& origin, std::set<Reason>& said);

} // namespace orvane::desk
