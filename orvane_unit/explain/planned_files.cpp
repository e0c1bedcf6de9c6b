// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/explain/planned_files.h"

#include "kit/host/bytes.h"
#include "kit/host/input_kind.h"
#include "kit/host/kit_error.h"
#include "kit/host/output_place.h"
#include "kit/host/whole_file.h"

#include <sys/stat.h>

#include <utility>

namespace orvane::desk {

bool PlannedFiles::openForWriting(const std::string& path) {
    const std::optional<kit::OutputPlace> place = kit::findOutputPlace(path);
    if (!place || !kit::canBeOpened(*place, isRunningSystem_)) {
        return false;
    }
    if (kit::keepsBytes(*place)) {
        written_[kit::fileName(*place)].clear();
    }
    return true;
}

std::optional<std::string> PlannedFiles::read(const std::string& path) const {
    const std::optional<kit::OutputPlace> place = kit::findOutputPlace(path);
    if (!place) {
        return std::nullopt;
    }
    const auto written = written_.find(kit::fileName(*place));
    if (written != written_.end()) {
        return written->second;
    }
    const kit::InputKind kind = kit::lookAtSequentialInput(place->path);
    if (kind == kit::InputKind::missing) {
        return std::nullopt;
    }
    // A folder opens and yields nothing.
    return kind == kit::InputKind::folder ? "" : kit::readWholeFile(place->path);
}

void PlannedFiles::write(const std::string& path, const std::string& text) {
    const std::optional<kit::OutputPlace> place = kit::findOutputPlace(path);
    if (place && kit::keepsBytes(*place)) {
        written_[kit::fileName(*place)] += text;
    }
}

bool PlannedFiles::isDevice(const std::string& path) {
    const std::optional<kit::OutputPlace> place = kit::findOutputPlace(path);
    return place && (place->kind == S_IFCHR || place->kind == S_IFBLK);
}

void PlannedFiles::requireTwoFiles(const std::string& output, const std::string& input) {
    const std::optional<kit::OutputPlace> place = kit::findOutputPlace(output);
    const std::optional<kit::OutputPlace> source = kit::findOutputPlace(input);
    if (place && source && kit::keepsBytes(*place) &&
        kit::fileName(*place) == kit::fileName(*source)) {
        throw kit::KitError(output + " and " + input +
                            " are one file: only a run can tell what it reads there");
    }
}

PathKind PlannedFiles::look(const std::string& path, std::string& content) const {
    content.clear();
    const std::optional<kit::OutputPlace> place = kit::findOutputPlace(path);
    if (!place) {
        return PathKind::nothing;
    }
    if (!kit::keepsBytes(*place)) {
        return place->kind == S_IFDIR ? PathKind::folder : PathKind::other;
    }
    const std::optional<std::string> text = read(path);
    content = text.value_or("");
    return text ? PathKind::file : PathKind::nothing;
}

} // namespace orvane::desk
