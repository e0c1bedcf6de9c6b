// SPDX-License-Identifier: Apache-2.0
//
// What a case expects: the folder NAME/expected, whose table of files case_check.h describes.
// Anything else in it belongs to whoever put it there.
#pragma once

#include "kit/enter/captured_run.h"
#include "orvane_unit/check/tmp_tree.h"

#include <filesystem>
#include <string>
#include <vector>

namespace orvane::desk {

/// What a run has printed and left.
struct RunOutcome {
    kit::RunResult end;
    TmpTree tmp;
};

/// How the outcome differs from what the case in `folder` expects; nothing when it does not. Throws
/// kit::KitError when an expectation can't be read.
std::vector<std::string> differencesFromExpected(const std::filesystem::path& folder,
                                                 const RunOutcome& outcome);

/// Makes the outcome what the case in `folder` expects, in one step: a process that is killed
/// leaves the old expectation or the new one. Files that are not in the table stay. Throws
/// kit::KitError, and changes nothing, when `folder`, `expected` or a place of the table at its top
/// is a link, or the system refuses.
void replaceExpected(const std::filesystem::path& folder, const RunOutcome& outcome);

} // namespace orvane::desk
