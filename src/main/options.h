// SPDX-License-Identifier: Apache-2.0
#pragma once

namespace orvane {

constexpr char IAP_OPTION = 'i';
constexpr char AIRPLAY_OPTION = 'a';
constexpr char OPTION_LETTERS[] = {IAP_OPTION, AIRPLAY_OPTION, '\0'};

/// Writes the files of one option.
using Writer = int (*)();

/// The writer of the next option, in command-line order; null when there is no more. Other letters
/// are left to the C library's own diagnostic.
Writer nextWriter(int argc, char* const argv[]);

/// Runs one writer. It throws only if memory runs out where no default can be used: it then ends,
/// as silently as after any other failure, and the next option can run.
void runWriter(Writer writer);

/// Runs the writer of every option. Always returns 0, whatever the writers do.
int runOptions(int argc, char* const argv[]);

} // namespace orvane
