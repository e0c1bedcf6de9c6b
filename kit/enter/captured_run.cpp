// SPDX-License-Identifier: Apache-2.0
#include "kit/enter/captured_run.h"

#include "kit/host/descriptor.h"
#include "kit/host/host_file.h"
#include "kit/host/kit_error.h"

#include <fcntl.h>
#include <sys/file.h>
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

/// Repeats `call`, a system call that returns a negative number on failure, while a signal
/// interrupts it.
template <class Call>
auto uninterrupted(const Call& call) {
    auto result = call();
    while (result < 0 && errno == EINTR) {
        result = call();
    }
    return result;
}

/// What a child writes, kept in memory.
class MemoryFile {
public:
    /// The lock belongs to the writing end and lasts as long as any process holds it. Writes
    /// append, so that none leaves a hole where a program has truncated its output (">
    /// /dev/stderr").
    MemoryFile() : forWriting_(::memfd_create("output", MFD_CLOEXEC)) {
        if (forWriting_.isOpen()) {
            const std::string name = "/proc/self/fd/" + std::to_string(forWriting_.number());
            forReading_ = Descriptor(::open(name.c_str(), O_RDONLY | O_CLOEXEC));
        }
        if (!forReading_.isOpen() || ::fcntl(forWriting_.number(), F_SETFL, O_APPEND) != 0 ||
            ::flock(forWriting_.number(), LOCK_EX) != 0) {
            throw systemError("cannot make a file for the program's output");
        }
    }

    const Descriptor& forWriting() const { return forWriting_; }

    /// All of it, once no process holds the writing end.
    std::string waitForAll() {
        forWriting_.close();
        if (uninterrupted([this] { return ::flock(forReading_.number(), LOCK_SH); }) != 0) {
            throw systemError("cannot wait for the program's output");
        }
        return readWhole(forReading_, "the program's output");
    }

private:
    Descriptor forWriting_;
    Descriptor forReading_;
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
        putDescriptor(outputs.standardOutput.forWriting(), STDOUT_FILENO);
        putDescriptor(outputs.standardError.forWriting(), STDERR_FILENO);
        becomeProgram();
    } catch (const std::exception& error) {
        reason = error.what();
    }
    // If this write fails, too, the status still tells.
    const ssize_t written =
        ::write(outputs.failedStart.forWriting().number(), reason.data(), reason.size());
    static_cast<void>(written);
    ::_exit(NOT_STARTED);
}

} // namespace

RunResult runCaptured(const std::function<void()>& becomeProgram) {
    Outputs outputs;
    const pid_t child = ::fork();
    if (child < 0) {
        throw systemError("cannot fork");
    }
    if (child == 0) {
        runChild(becomeProgram, outputs);
    }
    int status = 0;
    if (uninterrupted([&] { return ::waitpid(child, &status, 0); }) < 0) {
        throw systemError("cannot wait for the program");
    }
    RunResult result;
    result.exitStatus = WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
    result.standardOutput = outputs.standardOutput.waitForAll();
    result.standardError = outputs.standardError.waitForAll();
    const std::string reason = outputs.failedStart.waitForAll();
    if (!reason.empty()) {
        throw KitError(reason);
    }
    return result;
}

} // namespace orvane::kit
