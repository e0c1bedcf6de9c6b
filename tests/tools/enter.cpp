// SPDX-License-Identifier: Apache-2.0
//
// orvane-enter ROOT PROGRAM [ARGUMENT...]: becomes PROGRAM with "/" = ROOT, in this very process,
// so that a tracer of this process sees the program and no other. Exits with 125 when it can't.
#include "kit/start_plan.h"

#include <filesystem>
#include <iostream>
#include <string>
#include <vector>

namespace {

void enter(const std::vector<std::string>& words) {
    if (words.size() < 3) {
        throw orvane::kit::KitError("wants ROOT PROGRAM [ARGUMENT...]");
    }
    const std::filesystem::path root = std::filesystem::absolute(words[1]);
    orvane::kit::executePlan(orvane::kit::planStart({words[2], {words.begin() + 3, words.end()}}),
                             root);
}

} // namespace

int main(int argc, char* argv[]) {
    constexpr int CANNOT_ENTER = 125;
    try {
        enter({argv, argv + argc});
    } catch (const std::exception& failure) {
        std::cerr << "orvane-enter: " << failure.what() << '\n';
    }
    return CANNOT_ENTER;
}
