// SPDX-License-Identifier: Apache-2.0
//
// A folder of units with their expected outputs. Each has NAME/unit.toml, its options in
// NAME/arguments, one a line (by default "-a", "-i"), and in NAME/expected what /tmp holds after
// the run: tmp.list names every entry, folders with a slash at the end, or is "(absent)"; tmp/
// holds the files, and tmp.toml, if there, those that are described; stderr, if there, what the
// tool prints there.
#pragma once

#include "orvane_unit/explain/reasons.h"

#include <filesystem>
#include <set>
#include <string>
#include <vector>

namespace orvane::desk {

enum class CaseUpdate {
    none,     ///< not asked for
    done,     ///< the expectation is new
    needless, ///< it is as it should be
    refused,  ///< the run is not one of the tool, or not as explained, or the case has a fault
};

struct CaseResult {
    std::string name;
    std::vector<std::string> differences; ///< none when all is as expected
    std::vector<std::string> surprises;   ///< where explanation and run differ
    std::set<Reason> reasons;             ///< all that its explanation gives
    std::string fault; ///< why the case could not be run, compared or updated; empty if it could
    CaseUpdate update = CaseUpdate::none;

    bool isAsExpected() const { return differences.empty() && surprises.empty() && fault.empty(); }
};

struct CheckReport {
    std::vector<CaseResult> cases;      ///< by name
    std::vector<const char*> unreached; ///< codes that no case has
    bool isUpdate = false;
};

/// Runs `binary` in every unit of `folder`. With `updates`, what the run leaves becomes the new
/// expectation where it differs (expectation.h), unless the program is not the tool, as far as that
/// can be told, or the run is not as explained. A case that can't be read, run or updated has a
/// fault, and the next one follows. Throws kit::KitError for a folder without units, or a binary
/// that can't be run.
CheckReport checkCases(const std::filesystem::path& folder, const std::filesystem::path& binary,
                       bool updates);

} // namespace orvane::desk
