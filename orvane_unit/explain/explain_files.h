// SPDX-License-Identifier: Apache-2.0
//
// The two writers, without their files.
#pragma once

#include "orvane_unit/explain/explanation.h"
#include "orvane_unit/explain/planned_files.h"

namespace orvane::desk {

/// Adds the tuning files and the AirPlay file.
void explainAirplay(PlannedFiles& files, Explanation& outputs);

/// Adds the three iAP files.
void explainIap(PlannedFiles& files, Explanation& outputs);

} // namespace orvane::desk
