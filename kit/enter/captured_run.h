// SPDX-License-Identifier: Apache-2.0
//
// Running a child process and keeping what it says.
#pragma once

#include <functional>
#include <string>

namespace orvane::kit {

/// How a program ended, and what it said.
struct RunResult {
    int exitStatus = -1; ///< exit status, or 128 + signal number
    std::string standardOutput;
    std::string standardError;
};

/// Forks. The child has /dev/null as standard input, its two outputs are captured whole, and it
/// calls `becomeProgram`, which executes a program or throws KitError; what it throws, this throws
/// as well. Returns when the child has ended and nobody holds its outputs any more. Needs /proc.
RunResult runCaptured(const std::function<void()>& becomeProgram);

} // namespace orvane::kit
