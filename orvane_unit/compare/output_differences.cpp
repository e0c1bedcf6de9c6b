// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/compare/output_differences.h"

#include "kit/description/unit_layout.h"

#include <algorithm>
#include <cstddef>
#include <optional>
#include <utility>

namespace orvane::desk {

namespace {

using kit::ValueKey;
using Kind = ValueKey::Kind;

std::string textOf(const Output& output) {
    std::string text;
    for (const Line& line : output.lines) {
        text += line.text;
    }
    return text;
}

/// The key of each line of an output's text, by its number less one.
std::vector<ValueKey> keysByLine(const Output& output) {
    std::vector<ValueKey> keys;
    for (const Line& line : output.lines) {
        const auto ends =
            static_cast<std::size_t>(std::count(line.text.begin(), line.text.end(), '\n'));
        const bool isOpen = !line.text.empty() && line.text.back() != '\n';
        keys.insert(keys.end(), ends + (isOpen ? 1 : 0), line.origin.key);
    }
    return keys;
}

/// The keys of the lines that are left out because they have no value.
std::vector<ValueKey> keysOfMissingLines(const Output& output) {
    std::vector<ValueKey> keys;
    for (const Line& line : output.lines) {
        if (line.text.empty()) {
            keys.push_back(line.origin.key);
        }
    }
    return keys;
}

OutputDifference differenceOf(const Output& before, const Output& after) {
    OutputDifference difference{before.path, before.outcome, after.outcome, {}, {}};
    for (const auto& keys :
         {before.keys, after.keys, keysOfMissingLines(before), keysOfMissingLines(after)}) {
        difference.keys.insert(difference.keys.end(), keys.begin(), keys.end());
    }
    const std::vector<ValueKey> keysBefore = keysByLine(before);
    const std::vector<ValueKey> keysAfter = keysByLine(after);
    for (const Hunk& hunk : differingHunks(textOf(before), textOf(after))) {
        for (const DiffLine& line : hunk.lines) {
            if (line.kind == DiffLine::Kind::removed) {
                difference.lines.push_back({line, keysBefore.at(line.before - 1)});
            } else if (line.kind == DiffLine::Kind::added) {
                difference.lines.push_back({line, keysAfter.at(line.after - 1)});
            }
        }
    }
    return difference;
}

/// Whether `changed` is the value of `key`, or something at or above the path of that file.
bool isAbout(const ValueKey& changed, const ValueKey& key) {
    if (changed == key) {
        return true;
    }
    if (key.kind != Kind::file) {
        return false;
    }
    const std::string& path = key.name;
    switch (changed.kind) {
    case Kind::file:
    case Kind::fileBytes:
    case Kind::link:
    case Kind::folder:
        // The key of a folder ends with a slash: any file in it counts.
        return path == changed.name ||
               (path.back() == '/' && changed.name.compare(0, path.size(), path) == 0);
    case Kind::absent:
        return kit::isAtOrBelow(path, changed.name);
    case Kind::none:
    case Kind::imageSize:
    case Kind::param:
    case Kind::imageBytes:
    case Kind::slot:
    case Kind::slotByte:
    case Kind::aux:
    case Kind::tuningBlock:
    case Kind::tuningField:
    case Kind::tuningRaw:
    case Kind::diskBytes:
        break;
    }
    return false;
}

/// Collects the outputs and lines of each change.
class Distribution {
public:
    explicit Distribution(const std::vector<kit::ValueChange>& changes) {
        for (const kit::ValueChange& change : changes) {
            consequences_.push_back({change, {}});
        }
    }

    /// The index of the change that is about `key`; none if nothing like that has changed.
    std::optional<std::size_t> find(const ValueKey& key) const {
        const auto found = std::find_if(consequences_.begin(), consequences_.end(),
                                        [&key](const Consequence& consequence) {
                                            return isAbout(consequence.change.key, key);
                                        });
        if (found == consequences_.end()) {
            return std::nullopt;
        }
        return static_cast<std::size_t>(found - consequences_.begin());
    }

    std::optional<std::size_t> findAny(const std::vector<ValueKey>& keys) const {
        for (const ValueKey& key : keys) {
            if (const std::optional<std::size_t> found = find(key)) {
                return found;
            }
        }
        return std::nullopt;
    }

    /// Assigns `output`, and its `line` unless that is null, to the change at `index`; without an
    /// index, to the entry with the empty key.
    void assign(std::optional<std::size_t> index, const OutputDifference& output,
                const DifferingLine* line) {
        if (!index) {
            if (consequences_.empty() || !consequences_.back().change.key.isEmpty()) {
                consequences_.emplace_back();
            }
            index = consequences_.size() - 1;
        }
        std::vector<OutputDifference>& outputs = consequences_[*index].outputs;
        if (outputs.empty() || outputs.back().path != output.path) {
            outputs.push_back({output.path, output.before, output.after, output.keys, {}});
        }
        if (line != nullptr) {
            outputs.back().lines.push_back(*line);
        }
    }

    std::vector<Consequence> take() { return std::move(consequences_); }

private:
    std::vector<Consequence> consequences_;
};

} // namespace

std::vector<OutputDifference> outputDifferences(const Explanation& before,
                                                const Explanation& after) {
    std::vector<OutputDifference> differences;
    for (std::size_t i = 0; i < before.size(); ++i) {
        OutputDifference difference = differenceOf(before[i], after.at(i));
        if (!difference.lines.empty() || difference.before != difference.after) {
            differences.push_back(std::move(difference));
        }
    }
    return differences;
}

std::vector<Consequence> consequences(const std::vector<kit::ValueChange>& changes,
                                      const std::vector<OutputDifference>& differences) {
    Distribution distribution(changes);
    for (const OutputDifference& output : differences) {
        std::optional<std::size_t> whole = distribution.findAny(output.keys);
        if (output.lines.empty()) {
            distribution.assign(whole, output, nullptr);
        }
        for (const DifferingLine& line : output.lines) {
            const std::optional<std::size_t> own = distribution.find(line.key);
            if (own && !whole) {
                whole = own; // for the lines around it, such as the comment above a value
            }
            distribution.assign(own ? own : whole, output, &line);
        }
    }
    return distribution.take();
}

} // namespace orvane::desk
