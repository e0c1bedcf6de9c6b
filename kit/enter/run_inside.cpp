// SPDX-License-Identifier: Apache-2.0
#include "kit/enter/run_inside.h"

#include <sys/mount.h>

#include <filesystem>
#include <optional>
#include <system_error>

namespace orvane::kit {

namespace {

/// The folder for /proc in a unit without one, while a program needs it.
class ProcFolder {
public:
    explicit ProcFolder(const std::filesystem::path& root) : folder_(root / "proc") {
        std::error_code ignored; // a program that needs it says so itself
        isOurs_ = std::filesystem::create_directory(folder_, ignored);
    }
    ~ProcFolder() {
        if (isOurs_) {
            ::umount2(folder_.c_str(), MNT_DETACH); // a mount only in a changed root (showProc)
            std::error_code ignored;
            std::filesystem::remove(folder_, ignored);
        }
    }
    ProcFolder(const ProcFolder&) = delete;
    ProcFolder& operator=(const ProcFolder&) = delete;

private:
    std::filesystem::path folder_;
    bool isOurs_ = false;
};

} // namespace

RunResult runInside(const std::filesystem::path& root, const Program& program) {
    const ProgramStart start = findProgramStart(program);
    const std::filesystem::path absoluteRoot = std::filesystem::absolute(root);
    std::optional<ProcFolder> proc;
    if (start.isDynamic) {
        proc.emplace(absoluteRoot);
    }
    return runCaptured([&] {
        enterRootFor(start, absoluteRoot);
        becomeProgram(start);
    });
}

} // namespace orvane::kit
