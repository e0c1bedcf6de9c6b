// SPDX-License-Identifier: Apache-2.0
//
// The files of a unit as a run would change them, without writing. An output can be a link, hard or
// symbolic, to another output, a template or a stock file, so what is opened later has what the run
// has written.
#pragma once

#include "orvane_unit/explain/explanation.h"

#include <map>
#include <optional>
#include <string>

namespace orvane::desk {

/// Paths are those of the unit, which the process must have as its root.
class PlannedFiles {
public:
    /// `isRunningSystem` as of kit::canBeOpened.
    explicit PlannedFiles(bool isRunningSystem) : isRunningSystem_(isRunningSystem) {}

    /// Opens and truncates, as an output stream does. False when it can't be opened.
    bool openForWriting(const std::string& path);

    /// What an input stream gets: nothing when `path` can't be opened, an empty text for a folder.
    std::optional<std::string> read(const std::string& path) const;

    /// Appends to what was opened for writing.
    void write(const std::string& path, const std::string& text);

    /// Whether `path` leads to a device, which may refuse what is written.
    static bool isDevice(const std::string& path);

    /// Requires that an output is not the file that is read while it is written, or before it: what
    /// a run gets then depends on how much its streams read and write at a time. Throws
    /// kit::KitError.
    static void requireTwoFiles(const std::string& output, const std::string& input);

    /// What is at `path` now, links followed.
    PathKind look(const std::string& path, std::string& content) const;

private:
    bool isRunningSystem_;
    std::map<std::string, std::string> written_; ///< content by kit::fileName
};

} // namespace orvane::desk
