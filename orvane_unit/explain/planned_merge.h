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
#include <utility>
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

    /// Opens the output, which truncates it, then the template.
    PlannedMerge(PlannedFiles& files, const AccessoryFile& file);

    /// Names the merge of IAP2_FILE, whose failure is a reason for the stock file.
    void dependsOn(const PlannedMerge& iap2) { iap2_ = &iap2; }

    /// Has `generate` decide and do what is decided. `values` are what it renders, `sources` where
    /// they come from.
    template <class Values, class Generate>
    Output finish(const Values& values, const std::vector<MergedValue<Values>>& sources,
                  const Generate& generate) {
        const MergeDecision decision = generate(templateFile, output, values);
        if (needsStockFile(decision)) {
            return installStock(decision);
        }
        PlannedFiles::requireTwoFiles(file_.output, file_.templateFile);
        // A template is only copied, so a short one shows as well which bytes are whose.
        const std::optional<std::string> brief = briefTemplate();
        const auto render = [&generate](const Values& other,
                                        const std::optional<std::string>& content) {
            std::ostringstream text;
            std::istringstream stream = templateStream(content);
            generate(stream, text, other);
            return text.str();
        };
        const std::string text = render(values, brief);
        if (text.empty()) {
            return writeGenerated(text, {}); // no line that could carry a value
        }
        std::vector<ValueRegion> regions;
        for (const MergedValue<Values>& source : sources) {
            Values other = values;
            source.change(other);
            regions.push_back(changedLines(text, render(other, brief), source.origin));
        }
        if (brief && !brief->empty()) {
            regions.push_back(
                changedBytes(text, render(values, otherText(*brief)), templateOrigin()));
        }
        return writeGenerated(text, std::move(regions));
    }

private:
    static std::istringstream templateStream(const std::optional<std::string>& content);

    /// The first byte of the template; nothing of an empty one, and none where there is none.
    std::optional<std::string> briefTemplate() const;
    Origin templateOrigin() const;
    Output begin() const;
    Output keep() const;
    /// `text` and `regions` are those of the brief template.
    Output writeGenerated(const std::string& text, std::vector<ValueRegion> regions);
    Output installStock(MergeDecision decision);

    PlannedFiles& files_;
    AccessoryFile file_;
    bool isOutputOpen_;
    std::optional<std::string> template_; ///< its content, if it can be opened
    const PlannedMerge* iap2_ = nullptr;
};

} // namespace orvane::desk
