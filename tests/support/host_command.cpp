// SPDX-License-Identifier: Apache-2.0
#include "tests/support/host_command.h"

#include "kit/enter/captured_run.h"
#include "kit/host/kit_error.h"

#include <unistd.h>

namespace orvane::test {

kit::RunResult runOnHost(const std::vector<std::string>& command) {
    std::vector<std::string> words = command;
    std::vector<char*> argv;
    for (std::string& word : words) {
        argv.push_back(word.data());
    }
    argv.push_back(nullptr);
    return kit::runCaptured([&argv] {
        execvp(argv[0], argv.data());
        throw kit::systemError(std::string("cannot start ") + argv[0]);
    });
}

std::vector<std::string> buildCommand(const std::string& binary) {
    constexpr char EMULATOR[] = ORVANE_EMULATOR;
    if (EMULATOR[0] == '\0') {
        return {binary};
    }
    return {EMULATOR, binary};
}

} // namespace orvane::test
