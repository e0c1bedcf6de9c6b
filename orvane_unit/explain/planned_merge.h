// SPDX-License-Identifier: Apache-2.0
//
// The template merge and its fallback, on planned files.
#pragma once

#include "orvane_unit/explain/explanation.h"
#include "orvane_unit/explain/planned_files.h"
#include "orvane_unit/explain/reasons.h"
#include "orvane_unit/explain/value_origins.h"
#include "writers/template_merge.h"

#include <optional>
#include <string>
#include <vector>

namespace orvane::desk {

/// A value in a generated head: the line that begins with `prefix`, and what follows it.
struct HeadValue {
    std::string prefix;
    std::string text;
    Origin origin;
};

/// Takes a generated text apart: the lines of `values`, which stand in it in their order, and the
/// tool's own lines.
std::vector<Line> headLines(const std::string& text, const std::vector<HeadValue>& values);

/// One accessory file on its way. Opening it truncates the output, as the merge does.
class PlannedMerge {
public:
    PlannedMerge(PlannedFiles& files, const AccessoryFile& file);

    bool outputIsOpen() const { return outputIsOpen_; }
    bool templateIsOpen() const { return template_.has_value(); }
    bool templateIsEmpty() const { return template_ && template_->empty(); }

    /// Writes the generated lines, the template, and `end` if the template yields anything.
    Output generate(std::vector<Line> lines, const std::string& end);

    /// Puts the stock file in place, for the reason `cause`. `key` names the file behind it.
    Output installStock(Reason cause, const std::string& key);

    /// The output that can't be opened.
    Output keep() const;

private:
    Output begin() const;

    PlannedFiles& files_;
    AccessoryFile file_;
    bool outputIsOpen_;
    std::optional<std::string> template_; ///< its content, if it can be opened
};

} // namespace orvane::desk
