// SPDX-License-Identifier: Apache-2.0
//
// The reports as JSON, one object on one line each. All have "format" (JSON_FORMAT, raised when a
// change would break a reader), "command" and what the command was about; docs/orvane-unit.md has
// the rest. Bytes are a text where they are UTF-8, else {"hex": "..."}. Characters that are not
// printable are escaped.
#pragma once

#include "kit/enter/captured_run.h"
#include "orvane_unit/check/case_check.h"
#include "orvane_unit/check/tmp_tree.h"
#include "orvane_unit/compare/impact.h"
#include "orvane_unit/compare/output_differences.h"
#include "orvane_unit/explain/explanation.h"
#include "orvane_unit/show/decoded_unit.h"

#include <string>
#include <vector>

namespace orvane::desk {

constexpr int JSON_FORMAT = 1;

std::string explanationJson(const std::string& root, const std::string& letters,
                            const Explanation& explanation, bool hasContent);

/// `only` as in printDecodedUnit.
std::string decodedUnitJson(const std::string& root, const DecodedUnit& unit,
                            const std::string& only);

std::string runJson(const std::string& root, const kit::RunResult& result, const TmpTree& before,
                    const TmpTree& after);

std::string consequencesJson(const std::string& first, const std::string& second,
                             const std::vector<Consequence>& consequences);

std::string impactsJson(const std::string& root, const std::vector<Impact>& impacts);

std::string checkJson(const std::string& folder, const CheckReport& report);

} // namespace orvane::desk
