// SPDX-License-Identifier: Apache-2.0
//
// What orvane-unit does, once its command line is understood. Each command prints to standard
// output and throws KitError for wrong use or a bad root.
#pragma once

#include <string>
#include <vector>

namespace orvane::kit {

struct NewCommand {
    std::string root;
    std::string description; ///< a file; empty for the sample unit
};

/// Makes a unit.
void newUnit(const NewCommand& command);

struct RunCommand {
    std::string root;
    std::string binary; ///< orvane's; empty for the one beside this program, else the one on PATH
    bool showsFiles = false;
    std::vector<std::string> arguments; ///< orvane's own
};

/// Runs orvane in a unit, passes on what it says, and lists what it wrote below /tmp.
void runUnit(const RunCommand& command);

} // namespace orvane::kit
