// SPDX-License-Identifier: Apache-2.0
//
// Running a child process and keeping what it prints.
#pragma once

#include <functional>
#include <string>

namespace orvane::kit {

/// How a program ended, and what it printed.
struct RunResult {
    int exitStatus = -1; ///< exit status, or 128 + signal number
    std::string standardOutput;
    std::string standardError;
};

/// Forks. The child has /dev/null as standard input, its two outputs are captured whole, and it
/// calls `becomeProgram`, which executes a program or throws KitError; what that throws is thrown
/// here. Returns when the child has ended: what its own children write later is left out. SIGINT,
/// SIGTERM and SIGHUP end this process only when the child has been killed; the child is also
/// killed when this process is.
RunResult runCaptured(const std::function<void()>& becomeProgram);

} // namespace orvane::kit
