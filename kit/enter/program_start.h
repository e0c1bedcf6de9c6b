// SPDX-License-Identifier: Apache-2.0
//
// How a program of the host is started when the root directory is no longer the host's: by a
// descriptor opened before, or by a path relative to a working directory that is still the host's
// "/".
#pragma once

#include "kit/host/descriptor.h"

#include <filesystem>
#include <string>
#include <vector>

namespace orvane::kit {

/// A program and its arguments.
struct Program {
    std::filesystem::path path;         ///< the binary, on the host
    std::vector<std::string> arguments; ///< without argv[0], which is the binary's file name
};

struct ProgramStart {
    Descriptor binary;             ///< open: execute this, from the unit's "/"; closed: use `file`
    std::string file;              ///< the file to execute, relative to the host's "/"
    std::vector<std::string> argv; ///< the whole command line
    bool isDynamic = false;        ///< the program is started by a loader
};

/// Looks at the program and decides. Runs the loader of a dynamic one to find its libraries. Throws
/// KitError when there is no such program or no way to start it.
ProgramStart findProgramStart(const Program& program);

/// Makes `root`, an absolute path, the "/" of this process, and sets the working directory from
/// which the program can be started. Throws KitError when it can't.
void enterRootFor(const ProgramStart& start, const std::filesystem::path& root);

/// Executes the program once enterRootFor has prepared its process. Opens no file, so the program's
/// limits can be set in between. Does not return; throws KitError on failure.
void becomeProgram(const ProgramStart& start);

} // namespace orvane::kit
