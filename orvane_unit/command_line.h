// SPDX-License-Identifier: Apache-2.0
#pragma once

namespace orvane::desk {

/// The exit status of every command.
enum ExitStatus {
    EXIT_AS_INTENDED = 0,
    EXIT_ANSWER_IS_NO = 1, ///< a fallback or default, a difference, a failed check
    EXIT_BAD_INPUT = 2,    ///< wrong use, bad input, or a report that can't be written; a line on
                           ///< standard error says what
};

/// Reads the command line, does what it says, and returns the exit status. Prints on standard error
/// what goes wrong; throws nothing.
int runCommandLine(int argc, const char* const* argv);

} // namespace orvane::desk
