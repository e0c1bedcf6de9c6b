// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/check/case_check.h"

#include "kit/description/parse_description.h"
#include "kit/enter/captured_run.h"
#include "kit/enter/entered_root.h"
#include "kit/enter/program_start.h"
#include "kit/enter/run_inside.h"
#include "kit/host/kit_error.h"
#include "kit/host/output_place.h"
#include "kit/host/scratch_folder.h"
#include "kit/host/tree_entries.h"
#include "kit/host/unfinished_folder.h"
#include "kit/host/whole_file.h"
#include "kit/unit/make_unit.h"
#include "orvane_unit/check/expectation.h"
#include "orvane_unit/check/tmp_tree.h"
#include "orvane_unit/explain/explain.h"
#include "orvane_unit/explain/explanation.h"
#include "orvane_unit/explain/given_options.h"

#include <array>
#include <cstddef>
#include <map>
#include <optional>
#include <sstream>
#include <utility>

namespace orvane::desk {

namespace {

namespace fs = std::filesystem;

/// Also of a folder that can't be read: that is a fault of a case.
bool isCase(const fs::path& folder) {
    try {
        return kit::kindBehind(folder / "unit.toml") != fs::file_type::not_found;
    } catch (const kit::KitError&) {
        return true;
    }
}

std::vector<fs::path> caseFolders(const fs::path& folder) {
    std::vector<fs::path> folders;
    for (const fs::path& entry : kit::listFolder(folder)) {
        if (isCase(entry)) {
            folders.push_back(entry);
        }
    }
    if (folders.empty()) {
        throw kit::KitError("no folder in " + folder.string() + " holds a unit.toml");
    }
    return folders;
}

std::vector<std::string> argumentsOf(const fs::path& folder) {
    const std::optional<std::string> text = kit::readRegularFileIfThere(folder / "arguments");
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

/// The files that `paths` of the unit lead to, by links or not.
std::set<std::string> placesOf(const fs::path& root, const std::vector<std::string>& paths) {
    const kit::EnteredRoot entered(root);
    std::set<std::string> places;
    for (const std::string& path : paths) {
        if (const std::optional<kit::OutputPlace> place = kit::findOutputPlace(path)) {
            places.insert(place->path);
        }
    }
    return places;
}

/// Whether `text` is one line for each unknown option, as the C library prints it:
/// "orvane: invalid option -- 'x'".
bool isAboutOptions(const std::string& text, const std::string& program, std::size_t unknown) {
    std::size_t count = 0;
    std::istringstream lines(text);
    for (std::string line; std::getline(lines, line); ++count) {
        if (line.compare(0, program.size() + 2, program + ": ") != 0) {
            return false;
        }
    }
    return count == unknown;
}

/// What has become of an entry of /tmp; null when it is as it was.
const char* changeOf(const std::string& path, const TmpTree& before, const TmpTree& after) {
    const auto old = before.entries.find(path);
    const auto now = after.entries.find(path);
    return now == after.entries.end()    ? "removed"
           : old == before.entries.end() ? "made"
           : old->second != now->second  ? "changed"
                                         : nullptr;
}

/// What holds without an expectation: the tool always ends with 0 and prints nothing on standard
/// output.
void compareEnd(const kit::RunResult& run, std::vector<std::string>& differences) {
    if (run.exitStatus != 0) {
        differences.push_back("exit status " + std::to_string(run.exitStatus));
    }
    if (!run.standardOutput.empty()) {
        differences.emplace_back("standard output is not empty");
    }
}

/// What the program that has run has changed in /tmp and the tool would not: anything but outputs.
std::vector<std::string> strangeChanges(const fs::path& root, const std::set<std::string>& outputs,
                                        const TmpTree& before, const RunOutcome& outcome) {
    std::vector<std::string> changes;
    TmpTree both = before;
    both.entries.insert(outcome.tmp.entries.begin(), outcome.tmp.entries.end());
    for (const auto& [name, content] : both.entries) {
        const std::string path = pathInTmp(name);
        const char* const change = changeOf(name, before, outcome.tmp);
        if (change == nullptr) {
            continue;
        }
        const std::set<std::string> place = placesOf(root, {path});
        if (place.empty() || outputs.count(*place.begin()) == 0) {
            changes.push_back(path + " has been " + change + " and is not an output");
        }
    }
    return changes;
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

/// Adds the reasons that an explanation gives.
void addReasons(const Explanation& explanation, std::set<Reason>& reasons) {
    for (const Output& output : explanation) {
        reasons.insert(output.reasons.begin(), output.reasons.end());
        for (const Line& line : output.lines) {
            reasons.insert(line.origin.reasons.begin(), line.origin.reasons.end());
        }
    }
}

struct CaseRun {
    RunOutcome outcome;
    std::vector<std::string> foreignTraits; ///< what else tells that the program is not the tool
};

/// Runs the case in a unit that it makes at `root`, and compares with what holds for every run.
CaseRun runCase(const fs::path& folder, const fs::path& binary, const fs::path& root,
                CaseResult& result) {
    const fs::path description = folder / "unit.toml"; // no pipe, unlike that of the command `new`
    kit::makeUnit(kit::parseDescription(kit::readRegularFile(description, kit::LONGEST_DESCRIPTION),
                                        description),
                  root);
    const std::vector<std::string> arguments = argumentsOf(folder);
    const Explanation explanation = explainUnit(root, arguments);
    addReasons(explanation, result.reasons);
    std::vector<std::string> paths;
    for (const Output& output : explanation) {
        paths.push_back(output.path);
    }
    const std::set<std::string> outputs = placesOf(root, paths);
    const TmpTree before = readTmp(root);
    RunOutcome outcome;
    outcome.end = kit::runInside(root, {binary, arguments});
    outcome.tmp = readTmp(root);
    compareWithRun(explanation, outcome.tmp, result.surprises);
    compareEnd(outcome.end, result.differences);
    std::vector<std::string> traits = strangeChanges(root, outputs, before, outcome);
    if (!isAboutOptions(outcome.end.standardError, binary.filename().string(),
                        countUnknownOptions(arguments))) {
        traits.emplace_back("standard error is not a line for each unknown option");
    }
    return {std::move(outcome), std::move(traits)};
}

void addAll(const std::vector<std::string>& more, std::vector<std::string>& lines) {
    lines.insert(lines.end(), more.begin(), more.end());
}

/// The outcome becomes the expectation only if a check would find nothing else against it.
void update(const fs::path& folder, const CaseRun& run, CaseResult& result) {
    kit::removeLeftovers(folder); // also where nothing is written now
    addAll(run.foreignTraits, result.differences);
    if (!result.isAsExpected()) {
        return;
    }
    if (differencesFromExpected(folder, run.outcome).empty()) {
        result.update = CaseUpdate::needless;
        return;
    }
    replaceExpected(folder, run.outcome);
    result.update = CaseUpdate::done;
}

CaseResult checkCase(const fs::path& folder, const fs::path& binary, bool updates) {
    CaseResult result;
    result.name = folder.filename().string();
    result.update = updates ? CaseUpdate::refused : CaseUpdate::none;
    try {
        const kit::ScratchFolder scratch;
        const CaseRun run = runCase(folder, binary, scratch.path() / "unit", result);
        if (updates) {
            update(folder, run, result);
        } else {
            addAll(differencesFromExpected(folder, run.outcome), result.differences);
        }
    } catch (const kit::KitError& error) {
        result.fault = error.text();
    }
    return result;
}

} // namespace

CheckReport checkCases(const fs::path& folder, const fs::path& binary, bool updates) {
    kit::findProgramStart({binary, {}}); // one refusal in place of one for each case
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
