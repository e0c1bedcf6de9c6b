// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "kit/host/kit_error.h"

#include <fcntl.h>
#include <unistd.h>

#include <cstdio>
#include <string>

namespace orvane::test {

/// Captures standard output and standard error of this process from construction until `stop`. Uses
/// a pipe, not a temporary file, so that it works inside any unit; at most 64 KiB.
class StandardStreams {
public:
    StandardStreams() {
        int ends[2];
        if (pipe2(ends, O_CLOEXEC | O_NONBLOCK) != 0) {
            throw kit::systemError("pipe2");
        }
        static_cast<void>(std::fflush(stdout));
        static_cast<void>(std::fflush(stderr));
        readEnd_ = ends[0];
        formerOutput_ = fcntl(STDOUT_FILENO, F_DUPFD_CLOEXEC, 0);
        formerError_ = fcntl(STDERR_FILENO, F_DUPFD_CLOEXEC, 0);
        dup2(ends[1], STDOUT_FILENO);
        dup2(ends[1], STDERR_FILENO);
        close(ends[1]);
    }
    ~StandardStreams() {
        stop();
        close(readEnd_);
    }
    StandardStreams(const StandardStreams&) = delete;
    StandardStreams& operator=(const StandardStreams&) = delete;

    /// Ends the capture and returns what was written.
    std::string stop() {
        if (formerOutput_ != -1) {
            static_cast<void>(std::fflush(stdout));
            static_cast<void>(std::fflush(stderr));
            restore(formerOutput_, STDOUT_FILENO);
            restore(formerError_, STDERR_FILENO);
        }
        std::string said;
        char byte = 0;
        while (read(readEnd_, &byte, 1) == 1) {
            said.push_back(byte);
        }
        return said;
    }

private:
    static void restore(int& former, int stream) {
        dup2(former, stream);
        close(former);
        former = -1;
    }

    int readEnd_ = -1;
    int formerOutput_ = -1;
    int formerError_ = -1;
};

} // namespace orvane::test
