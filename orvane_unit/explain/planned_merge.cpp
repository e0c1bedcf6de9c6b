// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/explain/planned_merge.h"

#include <algorithm>
#include <cstddef>
#include <utility>

namespace orvane::desk {

namespace {

std::string fileKey(const char* path) {
    return std::string("file.") + path;
}

/// Adds the tool's own lines from `begin` to `end`.
void addFixedLines(std::vector<Line>& lines, const std::string& text, std::size_t begin,
                   std::size_t end) {
    while (begin < end) {
        const std::size_t next = std::min(text.find('\n', begin), end - 1) + 1;
        lines.push_back({text.substr(begin, next - begin), {Reason::fixedText}, "", ""});
        begin = next;
    }
}

} // namespace

std::vector<Line> headLines(const std::string& text, const std::vector<HeadValue>& values) {
    std::vector<Line> lines;
    std::size_t done = 0;
    for (const HeadValue& value : values) {
        const std::string line = value.prefix + value.text + "\n";
        const std::size_t at = text.find(line, done);
        if (value.prefix.empty() || at == std::string::npos) {
            lines.push_back({"", value.origin.reasons, value.origin.key, value.origin.detail});
            continue;
        }
        addFixedLines(lines, text, done, at);
        lines.push_back({line, value.origin.reasons, value.origin.key, value.origin.detail});
        done = at + line.size();
    }
    addFixedLines(lines, text, done, text.size());
    return lines;
}

PlannedMerge::PlannedMerge(PlannedFiles& files, const AccessoryFile& file)
    : files_(files), file_(file), outputIsOpen_(files.openForWriting(file.output)),
      template_(files.read(file.templateFile)) {}

Output PlannedMerge::begin() const {
    Output output;
    output.path = file_.output;
    output.keys = {fileKey(file_.output)};
    return output;
}

Output PlannedMerge::generate(std::vector<Line> lines, const std::string& end) {
    Output output = begin();
    output.keys.push_back(fileKey(file_.templateFile));
    output.lines = std::move(lines);
    if (!template_) {
        output.reasons = {Reason::templateMissing};
    } else if (template_->empty()) {
        output.reasons = {Reason::templateEmpty};
    } else {
        output.reasons = {Reason::generated};
        output.lines.push_back(
            {*template_, {Reason::fromTemplate}, fileKey(file_.templateFile), file_.templateFile});
        addFixedLines(output.lines, end, 0, end.size());
    }
    for (const Line& line : output.lines) {
        files_.write(file_.output, line.text);
    }
    return output;
}

Output PlannedMerge::installStock(Reason cause, const std::string& key) {
    Output output = begin();
    output.reasons = {cause};
    output.keys.push_back(key);
    output.keys.push_back(fileKey(file_.stockFile));
    const std::optional<std::string> stock = files_.read(file_.stockFile);
    if (!stock || stock->empty()) {
        output.outcome = Outcome::empty;
        output.reasons.push_back(stock ? Reason::stockEmpty : Reason::stockMissing);
        return output;
    }
    output.outcome = Outcome::stock;
    output.lines = {{*stock, {Reason::fromStock}, fileKey(file_.stockFile), file_.stockFile}};
    files_.write(file_.output, *stock);
    return output;
}

Output PlannedMerge::keep() const {
    Output output = begin();
    output.outcome = Outcome::kept;
    output.reasons = {Reason::outputNotOpenable};
    return output;
}

} // namespace orvane::desk
