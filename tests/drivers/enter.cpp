// SPDX-License-Identifier: Apache-2.0
//
// orvane-enter [--memory=BYTES] [--files=COUNT] ROOT PROGRAM [ARGUMENT...]: becomes PROGRAM with
// "/" = ROOT, in this same process, so that a tracer of this process sees only the program.
// The limits are those of the program (RLIMIT_AS, RLIMIT_NOFILE). Exits with 125 when it can't.
#include "kit/enter/change_root.h"
#include "kit/enter/program_start.h"
#include "kit/host/kit_error.h"

#include <sys/resource.h>
#include <unistd.h>

#include <filesystem>
#include <iostream>
#include <string>
#include <vector>

namespace {

using orvane::kit::KitError;
using orvane::kit::ProgramStart;

struct Limits {
    rlim_t memory = RLIM_INFINITY; ///< bytes of address space
    rlim_t files = RLIM_INFINITY;  ///< descriptors
};

/// Removes the options from the front of `words` and returns them.
Limits takeLimits(std::vector<std::string>& words) {
    const std::string memory = "--memory=";
    const std::string files = "--files=";
    Limits limits;
    while (!words.empty() && words.front().rfind("--", 0) == 0) {
        const std::string word = words.front();
        if (word.rfind(memory, 0) == 0) {
            limits.memory = std::stoul(word.substr(memory.size()));
        } else if (word.rfind(files, 0) == 0) {
            limits.files = std::stoul(word.substr(files.size()));
        } else {
            throw KitError("unknown option " + word);
        }
        words.erase(words.begin());
    }
    return limits;
}

/// Lowers only the soft limit, which needs no privilege.
void limit(__rlimit_resource resource, rlim_t soft) {
    rlimit limits{};
    if (soft == RLIM_INFINITY) {
        return;
    }
    if (getrlimit(resource, &limits) != 0) {
        throw orvane::kit::systemError("getrlimit");
    }
    limits.rlim_cur = soft;
    if (setrlimit(resource, &limits) != 0) {
        throw orvane::kit::systemError("setrlimit");
    }
}

/// The program stays in this process, so nobody could remove copies of the files that it opens from
/// the unit: they are reached through a working directory that is the host's "/".
void enterUnit(const ProgramStart& start, const std::filesystem::path& root) {
    const bool needsFiles = !orvane::kit::filesOf(start).empty();
    if (needsFiles && chdir("/") != 0) {
        throw orvane::kit::systemError("cannot enter the host's root directory");
    }
    if (start.way == ProgramStart::Way::byLoader) {
        orvane::kit::showProc(root); // it may have sanitizers
    }
    orvane::kit::changeRoot(root);
    if (!needsFiles && chdir("/") != 0) {
        throw orvane::kit::systemError("cannot enter ", root);
    }
}

void enter(std::vector<std::string> words) {
    const Limits limits = takeLimits(words);
    if (words.size() < 2) {
        throw KitError("wants ROOT PROGRAM [ARGUMENT...]");
    }
    const std::filesystem::path root = std::filesystem::absolute(words[0]);
    const ProgramStart start =
        orvane::kit::findProgramStart({words[1], {words.begin() + 2, words.end()}});
    enterUnit(start, root);
    // After entering, because that opens files.
    limit(RLIMIT_AS, limits.memory);
    limit(RLIMIT_NOFILE, limits.files);
    orvane::kit::becomeProgram(start, "");
}

} // namespace

int main(int argc, char* argv[]) {
    constexpr int CANNOT_ENTER = 125;
    try {
        enter({argv + 1, argv + argc});
    } catch (const std::exception& failure) {
        std::cerr << "orvane-enter: " << failure.what() << '\n';
    }
    return CANNOT_ENTER;
}
