// SPDX-License-Identifier: Apache-2.0
//
// How two explanations differ, and which values cause it.
#pragma once

#include "kit/description/value_key.h"
#include "kit/unit/unit_values.h"
#include "orvane_unit/compare/text_diff.h"
#include "orvane_unit/explain/explanation.h"

#include <string>
#include <vector>

namespace orvane::desk {

/// A line that only one of the two has.
struct DifferingLine {
    DiffLine line;
    kit::ValueKey key; ///< of the value it comes from; empty for the tool's own text
};

/// An output that differs.
struct OutputDifference {
    std::string path;
    Outcome before = Outcome::generated;
    Outcome after = Outcome::generated;
    std::vector<kit::ValueKey> keys; ///< of the values that decided either outcome
    std::vector<DifferingLine> lines;
};

/// The outputs that differ; both explanations are of the same option letters.
std::vector<OutputDifference> outputDifferences(const Explanation& before,
                                                const Explanation& after);

/// A value that differs, and the outputs that differ because of it.
struct Consequence {
    kit::ValueChange change;
    std::vector<OutputDifference> outputs;
};

/// Assigns every differing line to the changed value that it comes from; where its own value has
/// not changed, to one that decided its output's outcome. What no value explains goes to a last
/// entry with an empty key.
std::vector<Consequence> consequences(const std::vector<kit::ValueChange>& changes,
                                      const std::vector<OutputDifference>& differences);

} // namespace orvane::desk
