// SPDX-License-Identifier: Apache-2.0
#pragma once

namespace orvane::desk {

/// Reads the command line, does what it says, and returns the exit status. What goes wrong is one
/// complaint on standard error; nothing is thrown.
int runCommandLine(int argc, const char* const* argv);

} // namespace orvane::desk
