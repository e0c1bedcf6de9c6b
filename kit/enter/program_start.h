// SPDX-License-Identifier: Apache-2.0
//
// How a program of the host is started when the root directory is no longer the host's: a static
// one by a descriptor that was opened before, any other through a program that opens files of the
// host by their paths.
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

/// What is needed to start a program. Paths are relative to the host's "/" and have no symbolic
/// links.
struct ProgramStart {
    enum class Way { byDescriptor, byLoader, byEmulator };

    Way way = Way::byDescriptor;
    std::string name; ///< argv[0]
    std::vector<std::string> arguments;
    Descriptor binary;                  ///< byDescriptor: the program
    std::string starter;                ///< else: the loader or the emulator,
    std::string program;                ///< the program,
    std::vector<std::string> libraries; ///< and byLoader its libraries
};

/// Looks at the program and decides. Runs the loader of a dynamic one to find its libraries. Throws
/// KitError when there is no such program or no way to start it.
ProgramStart findProgramStart(const Program& program);

/// The files that are opened by their paths when the program starts; none byDescriptor.
std::vector<std::string> filesOf(const ProgramStart& start);

/// Executes the program in a process that has entered the unit. `hostRoot` is the folder that
/// stands for the host's "/" and has the files of filesOf; empty for the working directory. Opens
/// no file itself. Does not return; throws KitError on failure.
[[noreturn]] void becomeProgram(const ProgramStart& start, const std::string& hostRoot);

} // namespace orvane::kit
