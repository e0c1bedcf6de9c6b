// SPDX-License-Identifier: Apache-2.0
#include "kit/commands.h"

#include "kit/kit_error.h"
#include "kit/root.h"
#include "kit/unit.h"
#include "kit/written_files.h"

#include <cstdlib>
#include <fstream>
#include <iostream>
#include <sstream>

namespace orvane::kit {

namespace {

namespace fs = std::filesystem;

constexpr char TOOL[] = "orvane";

bool isProgram(const fs::path& file) {
    std::error_code error;
    return fs::is_regular_file(file, error);
}

/// The tool beside this program, else on PATH.
fs::path findTool() {
    std::error_code error;
    fs::path beside = fs::read_symlink("/proc/self/exe", error).parent_path() / TOOL;
    if (!error && isProgram(beside)) {
        return beside;
    }
    const char* const path = std::getenv("PATH");
    std::istringstream folders(path != nullptr ? path : "");
    for (std::string folder; std::getline(folders, folder, ':');) {
        if (!folder.empty() && isProgram(fs::path(folder) / TOOL)) {
            return fs::path(folder) / TOOL;
        }
    }
    throw KitError("there is no orvane beside this program or on PATH: name it with --orvane");
}

void checkUnit(const fs::path& root) {
    std::error_code error;
    if (!fs::is_directory(root, error)) {
        throw KitError(root.string() + " is not a folder");
    }
    if (!fs::exists(root / "fs", error) && !fs::exists(root / "dev", error) &&
        !fs::exists(root / "tmp", error)) {
        throw KitError(root.string() + " is not a unit: it has no fs, no dev and no tmp");
    }
}

void showFile(const std::string& name, const fs::path& file) {
    std::cout << "==> " << name << " <==\n";
    std::ostringstream content;
    content << std::ifstream(file, std::ios::binary).rdbuf();
    const std::string text = content.str();
    std::cout << text << (text.empty() || text.back() == '\n' ? "" : "\n");
}

} // namespace

void newUnit(const NewCommand& command) {
    const UnitDescription unit = command.description.empty()
                                     ? parseDescription(sampleDescriptionText(), "sample unit")
                                     : readDescription(command.description);
    makeUnit(unit, command.root);
    std::cout << "made " << command.root << " from "
              << (command.description.empty() ? "the sample unit" : command.description) << '\n';
}

void runUnit(const RunCommand& command) {
    const fs::path root = command.root;
    checkUnit(root);
    const Program program{command.binary.empty() ? findTool() : fs::path(command.binary),
                          command.arguments};
    const fs::path folder = root / "tmp";
    const Snapshot before = takeSnapshot(folder);
    awaitNewMarks();
    const RunResult result = runInside(root, program);
    const Snapshot after = takeSnapshot(folder);

    std::cout << result.standardOutput;
    std::cerr << result.standardError;
    if (result.exitStatus != 0) {
        std::cerr << "orvane-unit: orvane ended with status " << result.exitStatus << '\n';
    }
    const std::vector<std::string> written = writtenBetween(before, after);
    if (written.empty()) {
        std::cout << "wrote nothing\n";
    }
    for (const std::string& name : written) {
        std::cout << "wrote /tmp/" << name << ", " << after.at(name).size << " bytes\n";
    }
    if (command.showsFiles) {
        for (const std::string& name : written) {
            showFile("/tmp/" + name, folder / name);
        }
    }
}

} // namespace orvane::kit
