// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "orvane_unit/check/tmp_tree.h"

#include <iosfwd>

namespace orvane::desk {

/// Prints a diff of each file in /tmp that a run has made or changed. With `isBrief`, prints only
/// its name and size.
void printTmpChanges(std::ostream& out, const TmpTree& before, const TmpTree& after, bool isBrief);

} // namespace orvane::desk
