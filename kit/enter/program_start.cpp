// SPDX-License-Identifier: Apache-2.0
#include "kit/enter/program_start.h"

#include "kit/enter/captured_run.h"
#include "kit/enter/elf_header.h"
#include "kit/host/kit_error.h"

#include <elf.h>
#include <fcntl.h>
#include <unistd.h>

#include <set>
#include <sstream>
#include <system_error>

namespace orvane::kit {

namespace {

namespace fs = std::filesystem;

/// The emulator that the kit itself runs under, set by the build; empty when it runs directly.
constexpr char OWN_EMULATOR[] = ORVANE_KIT_EMULATOR;
constexpr char DEFAULT_EMULATOR[] = "/usr/bin/qemu-arm-static";

/// `file` without symbolic links, relative to "/".
std::string relativeToHost(const fs::path& file) {
    std::error_code error;
    const fs::path real = fs::canonical(file, error);
    if (error) {
        throw KitError("cannot find ", file, ": " + error.message());
    }
    return real.relative_path().string();
}

/// The array for execv, valid as long as `words`.
std::vector<char*> pointers(const std::vector<std::string>& words) {
    std::vector<char*> result;
    result.reserve(words.size() + 1);
    for (const std::string& word : words) {
        result.push_back(const_cast<char*>(word.c_str())); // NOLINT(*-const-cast): it changes none
    }
    result.push_back(nullptr);
    return result;
}

/// The libraries that the loader finds for `binary`. Lines of interest are
/// "libc.so.6 => /lib/x86_64-linux-gnu/libc.so.6 (0x...)". A library keeps its name, by which it is
/// looked for, even where that is a link.
std::vector<std::string> librariesOf(const fs::path& binary, const std::string& interpreter) {
    const std::vector<std::string> argv = {interpreter, "--list", fs::absolute(binary).string()};
    const RunResult listing = runCaptured([&argv] {
        ::execv(argv[0].c_str(), pointers(argv).data());
        throw systemError("cannot start " + argv[0]);
    });
    if (listing.exitStatus != 0) {
        throw KitError(interpreter + " cannot load " + binary.string());
    }
    std::vector<std::string> libraries;
    std::istringstream lines(listing.standardOutput);
    for (std::string line; std::getline(lines, line);) {
        std::istringstream words(line);
        std::string library;
        std::string arrow;
        std::string file;
        if (!(words >> library >> arrow >> file) || arrow != "=>") {
            continue;
        }
        if (file.front() != '/') { // "not found": the loader would look for it in the unit
            throw KitError("", binary, " needs the library " + library + ", which is not there");
        }
        const fs::path path(file);
        libraries.push_back(relativeToHost(path.parent_path()) + "/" + path.filename().string());
    }
    return libraries;
}

std::string emulatorFor(const Program& program) {
    const fs::path emulator = OWN_EMULATOR[0] != '\0' ? OWN_EMULATOR : DEFAULT_EMULATOR;
    std::error_code error;
    if (!fs::exists(emulator, error)) {
        throw KitError(program.path.string() + " is a 32-bit ARM program and there is no " +
                       emulator.string() + " to run it (Debian: qemu-user-static)");
    }
    return relativeToHost(emulator);
}

Descriptor openProgram(const fs::path& path) {
    Descriptor binary(::open(path.c_str(), O_RDONLY | O_CLOEXEC));
    if (!binary.isOpen()) {
        throw systemError("cannot open ", path);
    }
    return binary;
}

/// `folder` + "/" + `file`; `file` alone for an empty folder.
std::string below(const std::string& folder, const std::string& file) {
    return folder.empty() ? file : folder + "/" + file;
}

std::string libraryPath(const ProgramStart& start, const std::string& hostRoot) {
    std::set<std::string> folders;
    for (const std::string& library : start.libraries) {
        folders.insert(below(hostRoot, fs::path(library).parent_path().string()));
    }
    std::string path;
    for (const std::string& folder : folders) {
        path += (path.empty() ? "" : ":") + folder;
    }
    return path;
}

/// The command line without the program's own arguments.
std::vector<std::string> beginOfCommandLine(const ProgramStart& start,
                                            const std::string& hostRoot) {
    const std::string program = below(hostRoot, start.program);
    switch (start.way) {
    case ProgramStart::Way::byDescriptor:
        break;
    case ProgramStart::Way::byLoader:
        return {
            start.starter, "--argv0", start.name, "--library-path", libraryPath(start, hostRoot),
            program};
    case ProgramStart::Way::byEmulator:
        return {fs::path(start.starter).filename().string(), "-0", start.name, program};
    }
    return {start.name};
}

/// The environment without the variables by which a loader is told to load other files: their paths
/// would be the unit's.
std::vector<std::string> environmentForLoader() {
    std::vector<std::string> variables;
    for (char** variable = environ; *variable != nullptr; ++variable) {
        const std::string text = *variable;
        if (text.rfind("LD_", 0) != 0) {
            variables.push_back(text);
        }
    }
    return variables;
}

/// A unit could have code loaded that is not the program's.
void refusePreloading() {
    constexpr char PRELOAD[] = "/etc/ld.so.preload";
    if (::access(PRELOAD, F_OK) == 0) {
        throw KitError(
            std::string("the unit has ") + PRELOAD +
            ", which adds code to a dynamic program: link it with -static to run it here");
    }
}

} // namespace

ProgramStart findProgramStart(const Program& program) {
    const ElfHeader header = readElfHeader(program.path);
    const bool isEmulated =
        header.machine == EM_ARM && (ownMachine() != EM_ARM || OWN_EMULATOR[0] != '\0');
    if (isEmulated && !header.interpreter.empty()) {
        throw KitError("", program.path,
                       " is a dynamic 32-bit ARM program: link it with -static to run it here");
    }
    ProgramStart start;
    start.name = program.path.filename().string();
    start.arguments = program.arguments;
    if (isEmulated) {
        start.way = ProgramStart::Way::byEmulator;
        start.starter = emulatorFor(program);
        start.program = relativeToHost(program.path);
    } else if (!header.interpreter.empty()) {
        start.way = ProgramStart::Way::byLoader;
        start.starter = relativeToHost(header.interpreter);
        start.program = relativeToHost(program.path);
        start.libraries = librariesOf(program.path, header.interpreter);
    } else {
        start.binary = openProgram(program.path);
    }
    return start;
}

std::vector<std::string> filesOf(const ProgramStart& start) {
    if (start.way == ProgramStart::Way::byDescriptor) {
        return {};
    }
    std::vector<std::string> files = start.libraries;
    files.push_back(start.starter);
    files.push_back(start.program);
    return files;
}

void becomeProgram(const ProgramStart& start, const std::string& hostRoot) {
    std::vector<std::string> words = beginOfCommandLine(start, hostRoot);
    words.insert(words.end(), start.arguments.begin(), start.arguments.end());
    const std::vector<char*> argv = pointers(words);
    const std::string starter = below(hostRoot, start.starter);
    switch (start.way) {
    case ProgramStart::Way::byDescriptor:
        ::fexecve(start.binary.number(), argv.data(), environ);
        break;
    case ProgramStart::Way::byLoader: {
        refusePreloading();
        const std::vector<std::string> environment = environmentForLoader();
        ::execve(starter.c_str(), argv.data(), pointers(environment).data());
        break;
    }
    case ProgramStart::Way::byEmulator:
        ::execv(starter.c_str(), argv.data());
        break;
    }
    throw systemError("cannot start " + start.name);
}

} // namespace orvane::kit
