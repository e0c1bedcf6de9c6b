// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <iosfwd>
#include <optional>
#include <string>

namespace orvane::desk {

/// Prints a unified diff of the file `name`; a side is nothing if it has no file. Prints nothing
/// when both sides are the same. Anything that is not text is escaped.
void printUnifiedDiff(std::ostream& out, const std::string& name,
                      const std::optional<std::string>& before,
                      const std::optional<std::string>& after);

/// A line without its line end. Anything that is not text is escaped.
std::string printableLine(const std::string& line);

} // namespace orvane::desk
