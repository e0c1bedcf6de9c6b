// SPDX-License-Identifier: Apache-2.0
//
// orvane-enter ROOT PROGRAM [ARGUMENT...]: becomes PROGRAM with "/" = ROOT, in this very process,
// so that a tracer of this process sees the program and no other. Exits with 125 when it can't.
#include "kit/start_plan.h"

#include <filesystem>
#include <iostream>
#include <string>
#include <vector>

int main(int argc, char* argv[]) {
    constexpr int CANNOT_ENTER = 125;
    const std::vector<std::string> words(argv + 1, argv + argc);
    if (words.size() < 2) {
        std::cerr << "orvane-enter: wants ROOT PROGRAM [ARGUMENT...]\n";
        return CANNOT_ENTER;
    }
    try {
        const std::filesystem::path root = std::filesystem::absolute(words[0]);
        const std::filesystem::path program = words[1];
        orvane::kit::executePlan(
            orvane::kit::planStart({program, {words.begin() + 2, words.end()}}), root);
    } catch (const std::exception& failure) {
        std::cerr << "orvane-enter: " << failure.what() << '\n';
    }
    return CANNOT_ENTER;
}
