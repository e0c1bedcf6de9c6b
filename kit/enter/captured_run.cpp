// SPDX-License-Identifier: Apache-2.0
#include "kit/enter/captured_run.h"

#include "kit/host/descriptor.h"
#include "kit/host/kit_error.h"

#include <fcntl.h>
#include <poll.h>
#include <sys/wait.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <cstdlib>
#include <exception>
#include <string>
#include <utility>

namespace orvane::kit {

namespace {

/// Status of a child that could not become the program; its reason comes through a pipe.
constexpr int NOT_STARTED = 127;

struct Pipe {
    Descriptor readEnd;
    Descriptor writeEnd;
    std::string text; ///< what came through it
};

/// Both ends vanish from the child when it executes the program.
Pipe makePipe() {
    int ends[2];
    if (::pipe2(ends, O_CLOEXEC) != 0) {
        throw systemError("cannot make a pipe");
    }
    return {Descriptor(ends[0]), Descriptor(ends[1]), {}};
}

/// In the child: `from` as descriptor `to`, kept across the execution.
void putDescriptor(const Descriptor& from, int to) {
    if (!from.isOpen() || ::dup2(from.number(), to) < 0) {
        throw systemError("cannot redirect the program's input and output");
    }
}

/// Takes what `pipe` has to give, and closes its read end at the end of the stream.
void readSome(Pipe& pipe) {
    std::array<char, 4096> buffer{};
    const ssize_t count = ::read(pipe.readEnd.number(), buffer.data(), buffer.size());
    if (count > 0) {
        pipe.text.append(buffer.data(), static_cast<std::size_t>(count));
    } else if (count == 0 || errno != EINTR) {
        pipe.readEnd.close();
    }
}

/// Reads all pipes side by side, so that the child is never kept waiting by a full one.
void drain(std::array<Pipe, 3>& pipes) {
    std::array<pollfd, 3> waiting{};
    bool isAnyOpen = true;
    while (isAnyOpen) {
        isAnyOpen = false;
        for (std::size_t i = 0; i < pipes.size(); ++i) {
            waiting[i] = {pipes[i].readEnd.number(), POLLIN, 0}; // poll skips a descriptor of -1
            isAnyOpen = isAnyOpen || pipes[i].readEnd.isOpen();
        }
        if (!isAnyOpen || (::poll(waiting.data(), waiting.size(), -1) < 0 && errno != EINTR)) {
            return;
        }
        for (std::size_t i = 0; i < pipes.size(); ++i) {
            if (waiting[i].revents != 0) {
                readSome(pipes[i]);
            }
        }
    }
}

[[noreturn]] void runChild(const std::function<void()>& becomeProgram,
                           const std::array<Pipe, 3>& pipes) {
    std::string reason = "the program was not started";
    try {
        putDescriptor(Descriptor(::open("/dev/null", O_RDONLY | O_CLOEXEC)), STDIN_FILENO);
        putDescriptor(pipes[0].writeEnd, STDOUT_FILENO);
        putDescriptor(pipes[1].writeEnd, STDERR_FILENO);
        becomeProgram();
    } catch (const std::exception& error) {
        reason = error.what();
    }
    // Should even this write fail, the status still tells.
    const ssize_t written = ::write(pipes[2].writeEnd.number(), reason.data(), reason.size());
    static_cast<void>(written);
    ::_exit(NOT_STARTED);
}

} // namespace

RunResult runCaptured(const std::function<void()>& becomeProgram) {
    std::array<Pipe, 3> pipes = {makePipe(), makePipe(), makePipe()}; // out, error, failed start
    const pid_t child = ::fork();
    if (child < 0) {
        throw systemError("cannot fork");
    }
    if (child == 0) {
        runChild(becomeProgram, pipes);
    }
    for (Pipe& pipe : pipes) {
        pipe.writeEnd.close();
    }
    drain(pipes);
    int status = 0;
    while (::waitpid(child, &status, 0) < 0) {
        if (errno != EINTR) {
            throw systemError("cannot wait for the program");
        }
    }
    if (!pipes[2].text.empty()) {
        throw KitError(pipes[2].text);
    }
    RunResult result;
    result.exitStatus = WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
    result.standardOutput = std::move(pipes[0].text);
    result.standardError = std::move(pipes[1].text);
    return result;
}

} // namespace orvane::kit
