// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "orvane_unit/check/tmp_tree.h"

#include <iosfwd>

namespace orvane::desk {

/// Prints a diff of each file of /tmp that a run has made or changed; `isBrief`, only its name.
void printTmpChanges(std::ostream& out, const TmpTree& before, const TmpTree& after, bool isBrief);

} // namespace orvane::desk
