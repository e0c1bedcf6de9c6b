// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/explain/planned_merge.h"

#include "kit/description/value_key.h"
#include "orvane_unit/explain/place.h"
#include "orvane_unit/explain/reasons.h"

#include <utility>
#include <variant>

namespace orvane::desk {

PlannedMerge::PlannedMerge(PlannedFiles& files, const AccessoryFile& file)
    : files_(files), file_(file), isOutputOpen_(files.openForWriting(file.output)),
      template_(files.read(file.templateFile)) {
    if (!isOutputOpen_) {
        output.setstate(std::ios::failbit);
    }
    templateFile = templateStream(template_);
}

std::istringstream PlannedMerge::templateStream(const std::optional<std::string>& content) {
    std::istringstream stream(content.value_or(""));
    if (!content) {
        stream.setstate(std::ios::failbit);
    }
    return stream;
}

std::optional<std::string> PlannedMerge::briefTemplate() const {
    return template_ ? std::optional<std::string>(template_->substr(0, 1)) : std::nullopt;
}

Origin PlannedMerge::templateOrigin() const {
    return {
        {Reason::fromTemplate}, kit::fileKey(file_.templateFile), FilePlace{file_.templateFile}};
}

Output PlannedMerge::begin() const {
    Output result;
    result.path = file_.output;
    result.keys = {kit::fileKey(file_.output)};
    return result;
}

Output PlannedMerge::keep() const {
    Output result = begin();
    result.outcome = Outcome::kept;
    result.reasons = {Reason::outputNotOpenable};
    return result;
}

Output PlannedMerge::writeGenerated(const std::string& text, std::vector<ValueRegion> regions) {
    Output result = begin();
    result.outcome = text.empty() ? Outcome::empty : Outcome::generated;
    result.keys.push_back(kit::fileKey(file_.templateFile));
    result.reasons = {!template_           ? Reason::templateMissing
                      : template_->empty() ? Reason::templateEmpty
                                           : Reason::generated};
    result.lines = cutIntoLines(text, std::move(regions));
    for (Line& line : result.lines) {
        if (line.origin.reasons.front() == Reason::fromTemplate) {
            line.text = *template_;
        }
    }
    files_.write(file_.output, output.str());
    return result;
}

/// As installStockFile does: the stock file is opened first.
Output PlannedMerge::installStock(MergeDecision decision) {
    const std::optional<std::string> stock = files_.read(file_.stockFile);
    if (!files_.openForWriting(file_.output)) {
        return keep();
    }
    Output result = begin();
    if (decision == MergeDecision::iap2Failed && iap2_ != nullptr) {
        result.reasons = {iap2_->isOutputOpen_ ? Reason::iap2TemplateEmpty : Reason::iap2NotOpened};
        result.keys.push_back(
            kit::fileKey(iap2_->isOutputOpen_ ? iap2_->file_.templateFile : iap2_->file_.output));
    } else {
        result.reasons = {Reason::templateMissing};
        result.keys.push_back(kit::fileKey(file_.templateFile));
    }
    result.keys.push_back(kit::fileKey(file_.stockFile));

    std::istringstream source = templateStream(stock);
    std::ostringstream copy;
    copyBytes(source, copy);
    const std::string text = copy.str();
    if (text.empty()) {
        result.outcome = Outcome::empty;
        result.reasons.push_back(stock ? Reason::stockEmpty : Reason::stockMissing);
        return result;
    }
    result.outcome = Outcome::stock;
    result.lines = {
        {text, {{Reason::fromStock}, kit::fileKey(file_.stockFile), FilePlace{file_.stockFile}}}};
    files_.write(file_.output, text);
    return result;
}

} // namespace orvane::desk
