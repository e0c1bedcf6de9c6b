// SPDX-License-Identifier: Apache-2.0
//
// What a run of orvane would leave, and why: the result of explain.h. It holds no inputs.
#pragma once

#include "kit/description/value_key.h"
#include "orvane_unit/explain/place.h"
#include "orvane_unit/explain/reasons.h"

#include <string>
#include <vector>

namespace orvane::desk {

/// Where a piece of an output comes from.
struct Origin {
    std::vector<Reason> reasons; ///< why it is what it is
    kit::ValueKey key;           ///< of its value; empty for the tool's own text
    Place place;
};

/// A piece of an output: one line with its line end, or all lines of a template or of a value that
/// has line ends. The pieces of an output, in order, are its content.
struct Line {
    std::string text; ///< empty for a line that was left out
    Origin origin;
};

enum class Outcome {
    generated,
    stock,    ///< a copy of the stock file
    empty,    ///< opened, and nothing was written
    kept,     ///< could not be opened: what was there, if anything, stays
    notAsked, ///< not asked for: what was there, if anything, stays
};

/// What is at a path.
enum class PathKind { nothing, file, folder, other };

struct Output {
    std::string path;
    Outcome outcome = Outcome::generated;
    std::vector<Reason> reasons;     ///< what decided the outcome, in the order of the decisions
    std::vector<kit::ValueKey> keys; ///< of the values that decided it
    std::vector<Line> lines;         ///< none when kept or not asked
    PathKind kindAfter = PathKind::nothing; ///< after the whole run, links followed
    std::string contentAfter;               ///< of a file, after the whole run
};

/// The outputs in the order in which the run writes them; one that it writes twice has two entries.
using Explanation = std::vector<Output>;

/// The tool's own text.
Origin fixedText();

/// Whether no fallback or default was used.
bool isIntended(const std::vector<Reason>& reasons);
bool isIntended(const Output& output);
bool isIntended(const Explanation& explanation);

} // namespace orvane::desk
