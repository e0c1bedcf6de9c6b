// SPDX-License-Identifier: Apache-2.0
#pragma once

namespace orvane {
namespace platform {

/// getopt(3) as POSIX defines it: the next option letter, '?' for one that is not among the letters
/// (after the C library's own diagnostic), -1 at the end. The first operand and "--" are the end.
/// No letter of `letters` takes an argument.
int nextOption(int argc, char* const argv[], const char* letters);

} // namespace platform
} // namespace orvane
