// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/explain/planned_files.h"

#include "kit/host/bytes.h"
#include "kit/host/output_place.h"
#include "kit/host/whole_file.h"

#include <sys/stat.h>
#include <unistd.h>

#include <utility>

namespace orvane::desk {

bool PlannedFiles::openForWriting(const std::string& path) {
    const std::optional<kit::OutputPlace> place = kit::findOutputPlace(path);
    if (!place || !(written_.count(place->path) != 0 || kit::canBeWritten(*place))) {
        return false;
    }
    written_[place->path].clear();
    return true;
}

std::optional<std::string> PlannedFiles::read(const std::string& path) const {
    const std::optional<kit::OutputPlace> place = kit::findOutputPlace(path);
    if (!place) {
        return std::nullopt;
    }
    const auto written = written_.find(place->path);
    if (written != written_.end()) {
        return written->second;
    }
    // Anything else is not read: that would take bytes from a pipe, or wait for ever.
    const bool isFolder = place->kind == S_IFDIR;
    if ((!isFolder && place->kind != S_IFREG) || ::access(place->path.c_str(), R_OK) != 0) {
        return std::nullopt;
    }
    return isFolder ? "" : kit::readWholeFile(place->path); // a folder opens and yields nothing
}

void PlannedFiles::write(const std::string& path, const std::string& text) {
    if (const std::optional<kit::OutputPlace> place = kit::findOutputPlace(path)) {
        written_[place->path] += text;
    }
}

PathKind PlannedFiles::look(const std::string& path, std::string& content) const {
    content.clear();
    const std::optional<kit::OutputPlace> place = kit::findOutputPlace(path);
    if (!place) {
        return PathKind::nothing;
    }
    if (place->kind == S_IFDIR) {
        return PathKind::folder;
    }
    const std::optional<std::string> text = read(path);
    if (text) {
        content = *text;
        return PathKind::file;
    }
    return place->kind == 0 ? PathKind::nothing : PathKind::other;
}

} // namespace orvane::desk
