// SPDX-License-Identifier: Apache-2.0
//
// What a run would leave in a unit, found without writing: the tool's own functions make the
// values, the lines and the order of the files; only the opening of outputs, templates and stock
// files is replaced.
#pragma once

#include "kit/enter/entered_root.h"
#include "orvane_unit/explain/explanation.h"

#include <filesystem>
#include <string>
#include <vector>

namespace orvane::desk {

/// Explains a run with the command line `arguments` in the unit `entered`. Throws kit::KitError
/// where nobody can tell what the run does: at a pipe, at a device in place of a file that it
/// reads, at an output that is an input as well, and at what this process may not read.
Explanation explain(const kit::EnteredRoot& entered, const std::vector<std::string>& arguments);

/// The same for the unit at `root`, "/" for the system itself. Throws kit::KitError also when it
/// can't be entered.
Explanation explainUnit(const std::filesystem::path& root,
                        const std::vector<std::string>& arguments);

} // namespace orvane::desk
