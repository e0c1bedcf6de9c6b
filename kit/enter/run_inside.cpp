// SPDX-License-Identifier: Apache-2.0
#include "kit/enter/run_inside.h"

#include "kit/enter/change_root.h"
#include "kit/enter/host_files.h"
#include "kit/host/host_file.h"
#include "kit/host/kit_error.h"

#include <fcntl.h>
#include <linux/close_range.h>
#include <sys/mount.h>
#include <unistd.h>

#include <algorithm>
#include <filesystem>
#include <optional>
#include <string>
#include <system_error>
#include <vector>

namespace orvane::kit {

namespace {

namespace fs = std::filesystem;

constexpr bool SHOWS_PROC = ORVANE_KIT_SHOWS_PROC;

/// Whether the loader finds the library of AddressSanitizer.
bool isWatched(const ProgramStart& start) {
    return std::any_of(start.libraries.begin(), start.libraries.end(), [](const fs::path& library) {
        return library.filename().string().rfind("libasan.", 0) == 0;
    });
}

/// The folder for /proc in a unit without one, while a program needs it.
class ProcFolder {
public:
    explicit ProcFolder(const fs::path& root) : folder_(root / "proc") {
        std::error_code ignored; // a program that needs it says so itself
        isOurs_ = fs::create_directory(folder_, ignored);
    }
    ~ProcFolder() {
        if (isOurs_) {
            ::umount2(folder_.c_str(), MNT_DETACH); // visible here only in a changed root
            std::error_code ignored;
            fs::remove(folder_, ignored);
        }
    }
    ProcFolder(const ProcFolder&) = delete;
    ProcFolder& operator=(const ProcFolder&) = delete;

private:
    fs::path folder_;
    bool isOurs_ = false;
};

/// Lets every descriptor but the standard ones end with the execution of a program. The caller of
/// this process may have left some open.
void keepOnlyStandardStreams() {
    constexpr int FIRST = STDERR_FILENO + 1;
    if (::close_range(FIRST, ~0U, CLOSE_RANGE_CLOEXEC) == 0) {
        return;
    }
    const long end = ::sysconf(_SC_OPEN_MAX); // Linux before 5.11
    for (int number = FIRST; number < end; ++number) {
        ::fcntl(number, F_SETFD, FD_CLOEXEC);
    }
}

/// Makes `root` the "/" and the working directory of this process.
void enter(const fs::path& root) {
    changeRoot(root);
    if (::chdir("/") != 0) {
        throw systemError("cannot enter ", root);
    }
}

} // namespace

RunResult runInside(const fs::path& root, const Program& program) {
    const ProgramStart start = findProgramStart(program);
    const std::vector<std::string> files = filesOf(start);
    const fs::path absoluteRoot = fs::absolute(root);
    std::optional<HostFiles> hostFiles;
    if (!files.empty()) {
        requireFolder(absoluteRoot);
        hostFiles.emplace(absoluteRoot);
    }
    std::optional<ProcFolder> proc;
    if (SHOWS_PROC && isWatched(start)) {
        proc.emplace(absoluteRoot);
    }
    return runCaptured([&] {
        if (hostFiles) {
            hostFiles->fill(files);
        }
        if (proc) {
            showProc(absoluteRoot);
        }
        enter(absoluteRoot);
        keepOnlyStandardStreams();
        becomeProgram(start, hostFiles ? hostFiles->pathInUnit() : "");
    });
}

} // namespace orvane::kit
