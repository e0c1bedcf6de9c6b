// SPDX-License-Identifier: Apache-2.0
#pragma once

namespace orvane {

/// Runs a writer for every option letter, in command-line order: 'a' the AirPlay writer, 'i' the
/// iAP writer. Other letters are left to the C library's own diagnostic. Always returns 0, whatever
/// the writers do.
int runOptions(int argc, char* const argv[]);

} // namespace orvane
