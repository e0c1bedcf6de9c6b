// SPDX-License-Identifier: Apache-2.0
//
// A merge of an accessory file on planned files. The product's own functions do it, on streams that
// stand for the opened files.
#pragma once

#include "orvane_unit/explain/explanation.h"
#include "orvane_unit/explain/planned_files.h"
#include "orvane_unit/explain/value_lines.h"
#include "writers/template_merge.h"

#include <functional>
#include <optional>
#include <sstream>
#include <string>
#include <vector>

namespace orvane::desk {

/// A value that the generated lines carry.
template <class Values>
struct MergedValue {
    std::function<void(Values&)> change; ///< changes the value as changedBytes requires
    Origin origin;
};

/// The streams of a TemplateMerge, and their files.
class PlannedMerge {
public:
    std::ostringstream output;
    std::istringstream templateFile;
    const PlannedMerge* iap2 = nullptr; ///< the merge of IAP2_FILE, where the file depends on it

    /// Opens the output, which truncates it, then the template.
    void open(PlannedFiles& files, const AccessoryFile& file);

    /// Lets `generate` decide and write. It renders `values`, which come from `sources`.
    template <class Values, class Generate>
    Output finish(const Values& values, const std::vector<MergedValue<Values>>& sources,
                  const Generate& generate) {
        const MergeDecision decision = generate(templateFile, output, values);
        if (decision != MergeDecision::generate) {
            return installStock(decision);
        }
        if (!isOutputOpen_) {
            return keep();
        }
        const auto render = [&generate](const Values& other,
                                        const std::optional<std::string>& content) {
            std::ostringstream text;
            std::istringstream stream = templateStream(content);
            generate(stream, text, other);
            return text.str();
        };
        const std::string text = output.str();
        std::vector<ValueRegion> regions;
        for (const MergedValue<Values>& source : sources) {
            Values other = values;
            source.change(other);
            regions.push_back(changedLines(text, render(other, template_), source.origin));
        }
        if (template_ && !template_->empty()) {
            regions.push_back(
                changedBytes(text, render(values, otherText(*template_)), templateOrigin()));
        }
        return writeGenerated(text, std::move(regions));
    }

private:
    static std::istringstream templateStream(const std::optional<std::string>& content);

    Origin templateOrigin() const;
    Output begin() const;
    Output keep() const;
    Output writeGenerated(const std::string& text, std::vector<ValueRegion> regions);
    Output installStock(MergeDecision decision);

    PlannedFiles* files_ = nullptr;
    AccessoryFile file_{};
    bool isOutputOpen_ = false;
    std::optional<std::string> template_; ///< its content, if it can be opened
};

} // namespace orvane::desk
