// SPDX-License-Identifier: Apache-2.0
//
// The program as a user starts it.
#pragma once

#include "kit/enter/captured_run.h"
#include "tests/support/host_command.h"

#include <string>
#include <vector>

namespace orvane::test {

using Words = std::vector<std::string>;

inline Words operator+(Words words, const Words& more) {
    words.insert(words.end(), more.begin(), more.end());
    return words;
}

/// The command line that starts the program with these words.
inline Words orvaneUnit(const Words& words) {
    return buildCommand(ORVANE_UNIT_BINARY) + words;
}

inline kit::RunResult runOrvaneUnit(const Words& words) {
    return runOnHost(orvaneUnit(words));
}

} // namespace orvane::test
