// SPDX-License-Identifier: Apache-2.0
//
// The names of enumeration values in the reports.
#pragma once

#include "orvane_unit/check/case_check.h"
#include "orvane_unit/explain/explanation.h"
#include "orvane_unit/show/decoded_unit.h"

namespace orvane::desk {

/// The published names, the same in text and JSON: programs read them.
const char* nameOf(Outcome outcome);
const char* nameOf(CrcVerdict verdict);
const char* nameOf(CaseUpdate update); ///< CaseUpdate::none has no name
const char* nameOf(PathKind kind);

/// What is at a path, for people.
const char* wordOf(PathKind kind);

} // namespace orvane::desk
