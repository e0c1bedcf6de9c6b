// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/check/case_check.h"

#include "kit/description/parse_description.h"
#include "kit/enter/captured_run.h"
#include "kit/enter/run_inside.h"
#include "kit/host/bytes.h"
#include "kit/host/kit_error.h"
#include "kit/host/scratch_folder.h"
#include "kit/host/tree_entries.h"
#include "kit/host/whole_file.h"
#include "kit/unit/make_unit.h"
#include "orvane_unit/check/tmp_tree.h"
#include "orvane_unit/explain/explain.h"
#include "orvane_unit/explain/explanation.h"

#include <array>
#include <cstddef>
#include <fstream>
#include <map>
#include <optional>
#include <sstream>
#include <system_error>
#include <utility>

namespace orvane::desk {

namespace {

namespace fs = std::filesystem;

constexpr char NO_TMP[] = "(absent)";

std::vector<fs::path> caseFolders(const fs::path& folder) {
    std::vector<fs::path> folders;
    for (const fs::path& entry : kit::listFolder(folder)) {
        if (kit::kindBehind(entry / "unit.toml") != fs::file_type::not_found) {
            folders.push_back(entry);
        }
    }
    if (folders.empty()) {
        throw kit::KitError("no folder in " + folder.string() + " holds a unit.toml");
    }
    return folders;
}

void writeWhole(const fs::path& file, const std::string& text) {
    fs::create_directories(file.parent_path());
    std::ofstream out(file, std::ios::binary);
    out << text;
    out.close();
    if (!out) {
        throw kit::KitError("cannot write " + file.string());
    }
}

std::vector<std::string> argumentsOf(const fs::path& folder) {
    const std::optional<std::string> text = kit::readWholeFileIfThere(folder / "arguments");
    if (!text) {
        return {"-a", "-i"};
    }
    std::vector<std::string> arguments;
    std::istringstream lines(*text);
    for (std::string line; std::getline(lines, line);) {
        arguments.push_back(line);
    }
    return arguments;
}

std::string listOf(const TmpTree& tree) {
    if (!tree.isThere) {
        return std::string(NO_TMP) + "\n";
    }
    std::string list;
    for (const auto& [path, content] : tree.entries) {
        list += path + "\n";
    }
    return list;
}

std::set<std::string> linesOf(const std::string& text) {
    std::set<std::string> lines;
    std::istringstream in(text);
    for (std::string line; std::getline(in, line);) {
        lines.insert(line);
    }
    return lines;
}

void compareEntries(const std::set<std::string>& found, const std::set<std::string>& expected,
                    std::vector<std::string>& differences) {
    for (const std::string& name : expected) {
        if (found.count(name) == 0) {
            differences.push_back(pathInTmp(name) + " is missing");
        }
    }
    for (const std::string& name : found) {
        if (expected.count(name) == 0) {
            differences.push_back(pathInTmp(name) + " is not expected");
        }
    }
}

/// What holds without an expectation: the tool always ends with 0 and prints nothing on standard
/// output.
void compareEnd(const kit::RunResult& run, std::vector<std::string>& differences) {
    if (run.exitStatus != 0) {
        differences.push_back("exit status " + std::to_string(run.exitStatus));
    }
    if (!run.standardOutput.empty()) {
        differences.push_back("standard output is not empty");
    }
}

void compare(const fs::path& expected, const TmpTree& tree, const kit::RunResult& run,
             std::vector<std::string>& differences) {
    if (run.standardError != kit::readWholeFileIfThere(expected / "stderr").value_or("")) {
        differences.push_back("standard error differs");
    }
    const std::optional<std::string> list = kit::readWholeFileIfThere(expected / "tmp.list");
    if (!list) {
        differences.push_back("expected/tmp.list is missing");
        return;
    }
    const std::set<std::string> wanted = linesOf(*list);
    compareEntries(linesOf(listOf(tree)), wanted, differences);
    for (const auto& [path, content] : tree.entries) {
        if (content && wanted.count(path) != 0 &&
            *content != kit::readWholeFileIfThere(expected / "tmp" / path)) {
            differences.push_back(pathInTmp(path) + " differs");
        }
    }
}

void record(const fs::path& expected, const TmpTree& tree, const kit::RunResult& run) {
    fs::remove_all(expected);
    writeWhole(expected / "tmp.list", listOf(tree));
    if (!run.standardError.empty()) {
        writeWhole(expected / "stderr", run.standardError);
    }
    for (const auto& [path, content] : tree.entries) {
        if (content) {
            writeWhole(expected / "tmp" / path, *content);
        }
    }
}

void update(const fs::path& expected, const TmpTree& tree, const kit::RunResult& run) {
    try {
        record(expected, tree, run);
    } catch (const fs::filesystem_error& error) {
        throw kit::KitError("cannot write " + error.path1().string() + ": " +
                            error.code().message());
    }
}

/// Adds the outputs that are not as the explanation says.
void compareWithRun(const Explanation& explanation, const TmpTree& tree,
                    std::vector<std::string>& surprises) {
    const std::size_t folderLength = pathInTmp("").size();
    for (const Output& output : explanation) {
        const std::string name = output.path.substr(folderLength);
        const std::optional<std::string> file = tree.file(name);
        const bool agrees = output.kindAfter == PathKind::file     ? file == output.contentAfter
                            : output.kindAfter == PathKind::folder ? tree.hasFolder(name)
                                                                   : !file && !tree.hasFolder(name);
        if (!agrees) {
            surprises.push_back(output.path + " is not what the explanation says");
        }
    }
}

CaseResult checkCase(const fs::path& folder, const fs::path& binary, bool updates) {
    const kit::ScratchFolder scratch;
    const fs::path root = scratch.path() / "unit";
    kit::makeUnit(kit::readDescription(folder / "unit.toml"), root);
    const std::vector<std::string> arguments = argumentsOf(folder);

    CaseResult result;
    result.name = folder.filename().string();
    const Explanation explanation = explainUnit(root, arguments);
    for (const Output& output : explanation) {
        result.reasons.insert(output.reasons.begin(), output.reasons.end());
        for (const Line& line : output.lines) {
            result.reasons.insert(line.origin.reasons.begin(), line.origin.reasons.end());
        }
    }
    const kit::RunResult run = kit::runInside(root, {binary, arguments});
    const TmpTree tree = readTmp(root);
    compareWithRun(explanation, tree, result.surprises);
    compareEnd(run, result.differences);
    if (updates) {
        update(folder / "expected", tree, run);
    } else {
        compare(folder / "expected", tree, run, result.differences);
    }
    return result;
}

} // namespace

CheckReport checkCases(const fs::path& folder, const fs::path& binary, bool updates) {
    CheckReport report;
    report.isUpdate = updates;
    std::set<Reason> reached;
    for (const fs::path& path : caseFolders(folder)) {
        report.cases.push_back(checkCase(path, binary, updates));
        reached.insert(report.cases.back().reasons.begin(), report.cases.back().reasons.end());
    }
    for (const ReasonInfo& info : reasons()) {
        if (reached.count(info.reason) == 0) {
            report.unreached.push_back(info.code);
        }
    }
    return report;
}

} // namespace orvane::desk
