// SPDX-License-Identifier: Apache-2.0
#include "kit/enter/captured_run.h"

#include "kit/host/descriptor.h"
#include "kit/host/host_file.h"
#include "kit/host/kit_error.h"

#include <fcntl.h>
#include <sys/mman.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <exception>
#include <string>

namespace orvane::kit {

namespace {

/// Status of a child that could not become the program.
constexpr int NOT_STARTED = 127;

/// What a child writes, kept in memory.
class MemoryFile {
public:
    /// Writes append, so that none leaves a hole where a program has truncated its output (">
    /// /dev/stderr").
    MemoryFile() : descriptor_(::memfd_create("output", MFD_CLOEXEC)) {
        if (!descriptor_.isOpen() || ::fcntl(descriptor_.number(), F_SETFL, O_APPEND) != 0) {
            throw systemError("cannot make a file for the program's output");
        }
    }

    const Descriptor& descriptor() const { return descriptor_; }
    std::string content() const { return readWhole(descriptor_, "the program's output"); }

private:
    Descriptor descriptor_;
};

/// In the child: `from` as descriptor `to`, kept across the execution.
void putDescriptor(const Descriptor& from, int to) {
    if (!from.isOpen() || ::dup2(from.number(), to) < 0) {
        throw systemError("cannot redirect the program's input and output");
    }
}

struct Outputs {
    MemoryFile standardOutput;
    MemoryFile standardError;
    MemoryFile failedStart; ///< why the child could not become the program; empty when it could
};

[[noreturn]] void runChild(const std::function<void()>& becomeProgram, const Outputs& outputs) {
    std::string reason = "the program was not started";
    try {
        putDescriptor(Descriptor(::open("/dev/null", O_RDONLY | O_CLOEXEC)), STDIN_FILENO);
        putDescriptor(outputs.standardOutput.descriptor(), STDOUT_FILENO);
        putDescriptor(outputs.standardError.descriptor(), STDERR_FILENO);
        becomeProgram();
    } catch (const std::exception& error) {
        reason = error.what();
    }
    // If this write fails, too, the status still tells.
    const ssize_t written =
        ::write(outputs.failedStart.descriptor().number(), reason.data(), reason.size());
    static_cast<void>(written);
    ::_exit(NOT_STARTED);
}

} // namespace

RunResult runCaptured(const std::function<void()>& becomeProgram) {
    const Outputs outputs;
    const pid_t child = ::fork();
    if (child < 0) {
        throw systemError("cannot fork");
    }
    if (child == 0) {
        runChild(becomeProgram, outputs);
    }
    int status = 0;
    while (::waitpid(child, &status, 0) < 0) {
        if (errno != EINTR) {
            throw systemError("cannot wait for the program");
        }
    }
    RunResult result;
    result.exitStatus = WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
    result.standardOutput = outputs.standardOutput.content();
    result.standardError = outputs.standardError.content();
    const std::string reason = outputs.failedStart.content();
    if (!reason.empty()) {
        throw KitError(reason);
    }
    return result;
}

} // namespace orvane::kit
