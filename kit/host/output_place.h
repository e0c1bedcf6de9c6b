// SPDX-License-Identifier: Apache-2.0
//
// Where an output goes: the path resolved as by an output stream, which makes a missing file. All
// is found by looking, never by trying: the answers are those for a unit, where the tool may write
// everything, whatever this process may write here.
#pragma once

#include <sys/types.h>

#include <optional>
#include <string>

namespace orvane::kit {

struct OutputPlace {
    std::string path; ///< absolute and without links; its last name need not be there
    mode_t kind = 0;  ///< S_IFREG, S_IFDIR, ... of <sys/stat.h>; 0 when nothing is there
};

/// Follows the links of `path`, an absolute one, also to a file that is not there yet. Nothing when
/// the path is broken: a folder in it is missing or not a folder, or it has more links than the
/// system follows. Throws KitError when this process may not look at a folder in it.
std::optional<OutputPlace> findOutputPlace(const std::string& path);

/// One name for all paths of a file: its device and number; for a file that is not there yet, its
/// path without links.
std::string fileName(const OutputPlace& place);

/// Whether what is written there can be read again: not so in a device or pipe.
bool keepsBytes(const OutputPlace& place);

/// Whether a run on the unit can open the file there, or make it. A folder or socket can't be
/// opened; a device counts as one that can. A read-only mount matters only on the system that runs:
/// that of a unit's copy says nothing about the unit. Throws KitError for a pipe, at which the run
/// waits.
bool canBeOpened(const OutputPlace& place, bool isRunningSystem);

/// The same for a path; not for a broken one.
bool canBeOpened(const std::string& path, bool isRunningSystem);

} // namespace orvane::kit
