// SPDX-License-Identifier: Apache-2.0
#include "kit/enter/captured_run.h"

#include "kit/host/descriptor.h"
#include "kit/host/host_file.h"
#include "kit/host/interruption.h"
#include "kit/host/kit_error.h"

#include <fcntl.h>
#include <signal.h>
#include <sys/mman.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

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

/// While it exists, SIGCHLD waits to be asked for.
class ChildSignal {
public:
    ChildSignal() {
        sigset_t signals{};
        ::sigemptyset(&signals);
        ::sigaddset(&signals, SIGCHLD);
        ::sigprocmask(SIG_BLOCK, &signals, &former_);
    }
    ~ChildSignal() { restore(); }
    ChildSignal(const ChildSignal&) = delete;
    ChildSignal& operator=(const ChildSignal&) = delete;

    void restore() const { ::sigprocmask(SIG_SETMASK, &former_, nullptr); }

private:
    sigset_t former_{};
};

/// The status with which `child` ends. When this process is interrupted, the child is killed.
/// Requires that SIGCHLD and the interruptions wait.
int statusOf(pid_t child) {
    sigset_t signals = interruptions();
    ::sigaddset(&signals, SIGCHLD);
    int status = 0;
    for (;;) {
        const pid_t ended = ::waitpid(child, &status, WNOHANG);
        if (ended == child) {
            return status;
        }
        if (ended < 0) {
            throw systemError("cannot wait for the program");
        }
        const int signal = ::sigwaitinfo(&signals, nullptr);
        if (signal > 0 && signal != SIGCHLD) {
            ::kill(child, SIGKILL);
            ::waitpid(child, &status, 0);
            ::kill(::getpid(), signal); // it waits again
            throwIfInterrupted();
        }
    }
}

struct Outputs {
    MemoryFile standardOutput;
    MemoryFile standardError;
    MemoryFile failedStart; ///< why the child could not become the program; empty when it could
};

/// In the child: from now on it ends with its parent, so that it changes no unit for a dead caller.
void endWithParent(pid_t parent) {
    if (::prctl(PR_SET_PDEATHSIG, SIGKILL) != 0 || ::getppid() != parent) {
        throw KitError("the program has lost its caller");
    }
}

[[noreturn]] void runChild(const std::function<void()>& becomeProgram, const Outputs& outputs,
                           pid_t parent) {
    std::string reason = "the program was not started";
    // A program finds the signals as usual, whatever its starter does about them.
    static_cast<void>(::signal(SIGPIPE, SIG_DFL));
    static_cast<void>(::signal(SIGXFSZ, SIG_DFL));
    try {
        endWithParent(parent);
        allowInterruption();
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
    const DeferredInterruption deferred;
    const ChildSignal childSignal;
    const Outputs outputs;
    const pid_t parent = ::getpid();
    const pid_t child = ::fork();
    if (child < 0) {
        throw systemError("cannot fork");
    }
    if (child == 0) {
        childSignal.restore();
        runChild(becomeProgram, outputs, parent);
    }
    const int status = statusOf(child);
    throwIfInterrupted();
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
