// SPDX-License-Identifier: Apache-2.0
//
// Where an output goes: a path as an output stream takes it, which makes the file if it is not
// there.
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
/// the way is broken: a folder on it is missing or no folder, or links lead in a circle.
std::optional<OutputPlace> findOutputPlace(std::string path);

/// Whether this process may write what is there, or make it. A folder or socket can't be written.
bool canBeWritten(const OutputPlace& place);

/// The same for a path.
bool canBeWritten(const std::string& path);

} // namespace orvane::kit
