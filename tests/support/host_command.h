// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "kit/enter/captured_run.h"

#include <string>
#include <vector>

namespace orvane::test {

/// Runs a program of the host to its end, found on PATH when it is a bare name.
kit::RunResult runOnHost(const std::vector<std::string>& command);

/// The command line that starts a program of this build on the host: through the emulator of a
/// cross build.
std::vector<std::string> buildCommand(const std::string& binary);

} // namespace orvane::test
