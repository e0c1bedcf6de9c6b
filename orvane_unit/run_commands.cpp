// SPDX-License-Identifier: Apache-2.0
//
// The commands that run orvane itself.
#include "kit/enter/run_inside.h"
#include "kit/host/kit_error.h"
#include "kit/host/text.h"
#include "kit/unit/marker.h"
#include "orvane_unit/check/case_check.h"
#include "orvane_unit/check/tmp_tree.h"
#include "orvane_unit/commands.h"
#include "orvane_unit/explain/reasons.h"
#include "orvane_unit/report/json.h"
#include "orvane_unit/report/terminal.h"
#include "orvane_unit/report/unified_diff.h"

#include <algorithm>
#include <cstdlib>
#include <filesystem>
#include <iomanip>
#include <iostream>
#include <map>
#include <optional>
#include <sstream>
#include <string>
#include <system_error>
#include <utility>
#include <vector>

namespace orvane::desk {

namespace {

namespace fs = std::filesystem;

constexpr char ORVANE[] = "orvane";

std::string findBinary(const std::string& wanted) {
    if (!wanted.empty()) {
        return wanted;
    }
    std::error_code error;
    const fs::path own = fs::read_symlink("/proc/self/exe", error);
    if (!error && fs::is_regular_file(own.parent_path() / ORVANE, error)) {
        return own.parent_path() / ORVANE;
    }
    const char* path = std::getenv("PATH");
    std::istringstream folders(path == nullptr ? "" : path);
    for (std::string folder; std::getline(folders, folder, ':');) {
        if (fs::is_regular_file(fs::path(folder) / ORVANE, error)) {
            return fs::path(folder) / ORVANE;
        }
    }
    throw kit::KitError("orvane is neither beside orvane-unit nor on PATH: name it by --orvane");
}

void printChanges(const TmpTree& before, const TmpTree& after, bool isBrief) {
    for (const auto& [path, content] : after.entries) {
        const std::optional<std::string> old = before.file(path);
        if (!content || old == content) {
            continue;
        }
        if (isBrief) {
            std::cout << (old ? "changed " : "made ") << "/tmp/" << kit::printable(path) << ", "
                      << kit::counted(content->size(), "byte") << '\n';
        } else {
            printUnifiedDiff(std::cout, "/tmp/" + path, old, content);
        }
    }
}

void printCase(const CaseResult& result, std::size_t width) {
    const bool isGood = result.differences.empty() && result.surprises.empty();
    std::cout << std::left << std::setw(static_cast<int>(width)) << result.name << std::right
              << "  " << painted(isGood ? Colour::good : Colour::bad, isGood ? "ok" : "differs")
              << '\n';
    for (const std::vector<std::string>* lines : {&result.differences, &result.surprises}) {
        for (const std::string& line : *lines) {
            std::cout << "    " << kit::printable(line) << '\n';
        }
    }
}

void printCheck(const CheckReport& report, std::size_t failed) {
    std::size_t width = 0;
    for (const CaseResult& result : report.cases) {
        width = std::max(width, result.name.size());
    }
    for (const CaseResult& result : report.cases) {
        printCase(result, width);
    }
    std::cout << kit::counted(report.cases.size(), "unit") << ", " << failed << " not as expected"
              << (report.isUpdate ? "; expectations written anew" : "") << '\n';
    std::cout << "reasons reached: " << REASON_COUNT - report.unreached.size() << " of "
              << REASON_COUNT;
    for (std::size_t i = 0; i < report.unreached.size(); ++i) {
        std::cout << (i == 0 ? "; not reached: " : ", ") << report.unreached[i];
    }
    std::cout << '\n';
}

} // namespace

int runRun(const RunCommand& command) {
    kit::requireKitUnit(command.root);
    const TmpTree before = readTmp(command.root);
    const kit::RunResult result =
        kit::runInside(command.root, {findBinary(command.binary), command.arguments});
    const TmpTree after = readTmp(command.root);
    if (command.isJson) {
        std::cout << runJson(command.root, result, before, after) << '\n';
    } else {
        std::cout << result.standardOutput;
        std::cerr << result.standardError;
        printChanges(before, after, command.isBrief);
    }
    if (result.exitStatus != 0) {
        std::cerr << "orvane-unit: orvane ended with exit status " << result.exitStatus << '\n';
        return EXIT_ANSWER_IS_NO;
    }
    return EXIT_AS_INTENDED;
}

int runCheck(const CheckCommand& command) {
    const CheckReport report =
        checkCases(command.folder, findBinary(command.binary), command.updates);
    std::size_t failed = 0;
    for (const CaseResult& result : report.cases) {
        failed += result.differences.empty() && result.surprises.empty() ? 0U : 1U;
    }
    if (command.isJson) {
        std::cout << checkJson(command.folder, report) << '\n';
    } else {
        printCheck(report, failed);
    }
    return failed == 0 ? EXIT_AS_INTENDED : EXIT_ANSWER_IS_NO;
}

} // namespace orvane::desk
