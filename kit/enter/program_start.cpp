// SPDX-License-Identifier: Apache-2.0
#include "kit/enter/program_start.h"

#include "kit/enter/captured_run.h"
#include "kit/enter/change_root.h"
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

/// `file` without symbolic links, relative to "/". An absolute link would lead into the unit.
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

void append(std::vector<std::string>& argv, const std::vector<std::string>& more) {
    argv.insert(argv.end(), more.begin(), more.end());
}

/// The folders of the libraries that the loader finds for `binary`, as a relative search path.
/// Lines of interest are "libc.so.6 => /lib/x86_64-linux-gnu/libc.so.6 (0x...)".
std::string libraryPath(const std::string& interpreter, const fs::path& binary) {
    const std::vector<std::string> argv = {interpreter, "--list", fs::absolute(binary).string()};
    const RunResult listing = runCaptured([&argv] {
        ::execv(argv[0].c_str(), pointers(argv).data());
        throw systemError("cannot start " + argv[0]);
    });
    if (listing.exitStatus != 0) {
        throw KitError(interpreter + " cannot load " + binary.string());
    }
    std::set<std::string> folders;
    std::istringstream lines(listing.standardOutput);
    for (std::string line; std::getline(lines, line);) {
        std::istringstream words(line);
        std::string library;
        std::string arrow;
        std::string file;
        if (words >> library >> arrow >> file && arrow == "=>" && file.front() == '/') {
            folders.insert(relativeToHost(fs::path(file).parent_path()));
        }
    }
    std::string path;
    for (const std::string& folder : folders) {
        path += (path.empty() ? "" : ":") + folder;
    }
    return path;
}

ProgramStart emulatedStart(const Program& program, const std::string& name) {
    const fs::path emulator = OWN_EMULATOR[0] != '\0' ? OWN_EMULATOR : DEFAULT_EMULATOR;
    std::error_code error;
    if (!fs::exists(emulator, error)) {
        throw KitError(program.path.string() + " is a 32-bit ARM program and there is no " +
                       emulator.string() + " to run it (Debian: qemu-user-static)");
    }
    ProgramStart start;
    start.file = relativeToHost(emulator);
    start.argv = {emulator.filename().string(), "-0", name, relativeToHost(program.path)};
    return start;
}

ProgramStart dynamicStart(const Program& program, const std::string& name,
                          const std::string& interpreter) {
    ProgramStart start;
    start.isDynamic = true;
    start.file = relativeToHost(interpreter);
    start.argv = {start.file,
                  "--argv0",
                  name,
                  "--library-path",
                  libraryPath(interpreter, program.path),
                  relativeToHost(program.path)};
    return start;
}

ProgramStart staticStart(const Program& program, const std::string& name) {
    ProgramStart start;
    start.binary = Descriptor(::open(program.path.c_str(), O_RDONLY | O_CLOEXEC));
    if (!start.binary.isOpen()) {
        throw systemError("cannot open ", program.path);
    }
    start.argv = {name};
    return start;
}

} // namespace

ProgramStart findProgramStart(const Program& program) {
    const ElfHeader header = readElfHeader(program.path);
    const std::string name = program.path.filename().string();
    const bool isEmulated =
        header.machine == EM_ARM && (ownMachine() != EM_ARM || OWN_EMULATOR[0] != '\0');
    if (isEmulated && !header.interpreter.empty()) {
        throw KitError("", program.path,
                       " is a dynamic 32-bit ARM program: link it with -static to run it here");
    }
    ProgramStart start = isEmulated ? emulatedStart(program, name)
                         : header.interpreter.empty()
                             ? staticStart(program, name)
                             : dynamicStart(program, name, header.interpreter);
    append(start.argv, program.arguments);
    return start;
}

void enterRootFor(const ProgramStart& start, const std::filesystem::path& root) {
    const bool isByDescriptor = start.binary.isOpen();
    if (!isByDescriptor && ::chdir("/") != 0) {
        throw systemError("cannot enter the host's root directory");
    }
    if (start.isDynamic) {
        showProc(root);
    }
    changeRoot(root);
    if (isByDescriptor && ::chdir("/") != 0) {
        throw systemError("cannot enter ", root);
    }
}

void becomeProgram(const ProgramStart& start) {
    const std::vector<char*> argv = pointers(start.argv);
    if (start.binary.isOpen()) {
        ::fexecve(start.binary.number(), argv.data(), environ);
    } else {
        ::execv(start.file.c_str(), argv.data());
    }
    throw systemError("cannot start " + start.argv.front());
}

} // namespace orvane::kit
