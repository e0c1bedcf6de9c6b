// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/explain/planned_files.h"

#include "kit/host/bytes.h"
#include "kit/host/input_kind.h"
#include "kit/host/output_place.h"
#include "kit/host/whole_file.h"

#include <sys/stat.h>

#include <utility>

namespace orvane::desk {

namespace {

/// One name for all paths of a file: its device and number; for a file that is not there yet, its
/// path without links.
std::string fileName(const kit::OutputPlace& place) {
    struct stat state {};
    if (place.kind == 0 || ::stat(place.path.c_str(), &state) != 0) {
        return place.path;
    }
    return std::to_string(state.st_dev) + ":" + std::to_string(state.st_ino);
}

/// Whether what is written there can be read again: not so in a device or pipe.
bool keepsBytes(const kit::OutputPlace& place) {
    return place.kind == 0 || place.kind == S_IFREG;
}

} // namespace

bool PlannedFiles::openForWriting(const std::string& path) {
    const std::optional<kit::OutputPlace> place = kit::findOutputPlace(path);
    if (!place || !kit::canBeOpened(*place, isRunningSystem_)) {
        return false;
    }
    if (keepsBytes(*place)) {
        written_[fileName(*place)].clear();
    }
    return true;
}

std::optional<std::string> PlannedFiles::read(const std::string& path) const {
    const std::optional<kit::OutputPlace> place = kit::findOutputPlace(path);
    if (!place) {
        return std::nullopt;
    }
    const auto written = written_.find(fileName(*place));
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
    if (place && keepsBytes(*place)) {
        written_[fileName(*place)] += text;
    }
}

bool PlannedFiles::isDevice(const std::string& path) {
    const std::optional<kit::OutputPlace> place = kit::findOutputPlace(path);
    return place && (place->kind == S_IFCHR || place->kind == S_IFBLK);
}

PathKind PlannedFiles::look(const std::string& path, std::string& content) const {
    content.clear();
    const std::optional<kit::OutputPlace> place = kit::findOutputPlace(path);
    if (!place) {
        return PathKind::nothing;
    }
    if (!keepsBytes(*place)) {
        return place->kind == S_IFDIR ? PathKind::folder : PathKind::other;
    }
    const std::optional<std::string> text = read(path);
    content = text.value_or("");
    return text ? PathKind::file : PathKind::nothing;
}

} // namespace orvane::desk
