// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "kit/enter/captured_run.h"

#include <string>
#include <vector>

namespace orvane::test {

/// Runs a program of the host to its end. A bare name is searched on PATH.
kit::RunResult runOnHost(const std::vector<std::string>& command);

/// The command line that starts a program of this build on the host: in a cross build, through the
/// emulator.
std::vector<std::string> buildCommand(const std::string& binary);

} // namespace orvane::test
