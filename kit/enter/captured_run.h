// SPDX-License-Identifier: Apache-2.0
//
// Running a child process and keeping what it says.
#pragma once

#include "kit/enter/entered_root.h"

#include <functional>

namespace orvane::kit {

/// Forks. The child has /dev/null as standard input, its two outputs are captured whole, and it
/// calls `becomeProgram`, which executes a program or throws KitError; what it throws, this throws
/// as well. Returns when the child has ended and its outputs are closed.
RunResult runCaptured(const std::function<void()>& becomeProgram);

} // namespace orvane::kit
