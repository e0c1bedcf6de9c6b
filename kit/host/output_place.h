// SPDX-License-Identifier: Apache-2.0
//
// Where an output goes: the path resolved as by an output stream, which makes a missing file.
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
/// the path is broken: a folder in it is missing or not a folder, or links form a circle.
std::optional<OutputPlace> findOutputPlace(std::string path);

/// Whether this process may write the file there, or make it. A folder or socket can't be written.
bool canBeWritten(const OutputPlace& place);

/// The same for a path.
bool canBeWritten(const std::string& path);

} // namespace orvane::kit
