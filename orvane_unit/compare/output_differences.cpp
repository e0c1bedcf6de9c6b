// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/compare/output_differences.h"

#include <algorithm>
#include <cstddef>
#include <iterator>
#include <memory>
#include <optional>
#include <utility>

namespace orvane::desk {

namespace {

std::string textOf(const Output& output) {
    std::string text;
    for (const Line& line : output.lines) {
        text += line.text;
    }
    return text;
}

/// The key of each line of an output's text, by its number less one.
std::vector<std::string> keysByLine(const Output& output) {
    std::vector<std::string> keys;
    for (const Line& line : output.lines) {
        const auto ends =
            static_cast<std::size_t>(std::count(line.text.begin(), line.text.end(), '\n'));
        const bool isOpen = !line.text.empty() && line.text.back() != '\n';
        keys.insert(keys.end(), ends + (isOpen ? 1 : 0), keyText(line.origin.key));
    }
    return keys;
}

MovedOutput movedOutput(const Output& before, const Output& after) {
    MovedOutput moved{before.path, before.outcome, after.outcome, {}, {}};
    for (const std::vector<kit::ValueKey>* keys : {&before.keys, &after.keys}) {
        std::transform(keys->begin(), keys->end(), std::back_inserter(moved.keys), kit::keyText);
    }
    // A line that is left out for want of its value has nothing but its key.
    for (const Line& line : before.lines) {
        if (line.text.empty()) {
            moved.keys.push_back(keyText(line.origin.key));
        }
    }
    for (const Line& line : after.lines) {
        if (line.text.empty()) {
            moved.keys.push_back(keyText(line.origin.key));
        }
    }
    const std::vector<std::string> keysBefore = keysByLine(before);
    const std::vector<std::string> keysAfter = keysByLine(after);
    for (const Hunk& hunk : differingHunks(textOf(before), textOf(after))) {
        for (const DiffLine& line : hunk.lines) {
            if (line.kind == DiffLine::Kind::removed) {
                moved.lines.push_back({line, keysBefore.at(line.before - 1)});
            } else if (line.kind == DiffLine::Kind::added) {
                moved.lines.push_back({line, keysAfter.at(line.after - 1)});
            }
        }
    }
    return moved;
}

class Distribution {
public:
    explicit Distribution(const std::vector<ValueChange>& changes) {
        for (const ValueChange& change : changes) {
            consequences_.push_back({change, {}});
        }
    }

    /// The place of the entry for `key`; none when that value has not changed.
    std::optional<std::size_t> find(const std::string& key) const {
        for (std::size_t i = 0; i < consequences_.size(); ++i) {
            // "folder./tmp/x" and "absent./tmp" change the file of "file./tmp/x".
            if (consequences_[i].change.key == key || isAbout(consequences_[i].change.key, key)) {
                return i;
            }
        }
        return std::nullopt;
    }

    std::optional<std::size_t> findAny(const std::vector<std::string>& keys) const {
        for (const std::string& key : keys) {
            if (const std::optional<std::size_t> found = find(key)) {
                return found;
            }
        }
        return std::nullopt;
    }

    void give(std::optional<std::size_t> place, const MovedOutput& output, const MovedLine* line) {
        if (!place) {
            if (consequences_.empty() || !consequences_.back().change.key.empty()) {
                consequences_.emplace_back();
            }
            place = consequences_.size() - 1;
        }
        std::vector<MovedOutput>& moved = consequences_[*place].moved;
        if (moved.empty() || moved.back().path != output.path) {
            moved.push_back({output.path, output.before, output.after, output.keys, {}});
        }
        if (line != nullptr) {
            moved.back().lines.push_back(*line);
        }
    }

    std::vector<Consequence> take() { return std::move(consequences_); }

private:
    static bool isAbout(const std::string& changed, const std::string& key) {
        constexpr char FILE[] = "file.";
        const std::size_t dot = changed.find('.');
        if (dot == std::string::npos || key.compare(0, sizeof FILE - 1, FILE) != 0) {
            return false;
        }
        const std::string kind = changed.substr(0, dot);
        const std::string changedPath = changed.substr(dot + 1);
        const std::string path = key.substr(sizeof FILE - 1);
        if (kind == "file" || kind == "folder" || kind == "link") {
            // The key of a folder ends with a slash: any file in it counts.
            return path == changedPath ||
                   (path.back() == '/' && changedPath.compare(0, path.size(), path) == 0);
        }
        return kind == "absent" &&
               (path + "/").compare(0, changedPath.size() + 1, changedPath + "/") == 0;
    }

    std::vector<Consequence> consequences_;
};

} // namespace

std::vector<MovedOutput> movedOutputs(const Explanation& before, const Explanation& after) {
    std::vector<MovedOutput> moved;
    for (std::size_t i = 0; i < before.size(); ++i) {
        MovedOutput output = movedOutput(before[i], after.at(i));
        if (!output.lines.empty() || output.before != output.after) {
            moved.push_back(std::move(output));
        }
    }
    return moved;
}

std::vector<Consequence> consequences(const std::vector<ValueChange>& changes,
                                      const std::vector<MovedOutput>& moved) {
    Distribution distribution(changes);
    for (const MovedOutput& output : moved) {
        std::optional<std::size_t> whole = distribution.findAny(output.keys);
        if (output.lines.empty()) {
            distribution.give(whole, output, nullptr);
        }
        for (const MovedLine& line : output.lines) {
            const std::optional<std::size_t> own = distribution.find(line.key);
            if (own && !whole) {
                whole = own; // for the lines beside it, such as the comment above a value
            }
            distribution.give(own ? own : whole, output, &line);
        }
    }
    return distribution.take();
}

} // namespace orvane::desk
