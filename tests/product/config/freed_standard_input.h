// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <fcntl.h>
#include <unistd.h>

namespace orvane::test {

/// While it lives, descriptor 0 is free and the next open gets it: a program may be started without
/// standard input.
class FreedStandardInput {
public:
    FreedStandardInput() : former_(fcntl(STDIN_FILENO, F_DUPFD_CLOEXEC, 3)) { close(STDIN_FILENO); }
    ~FreedStandardInput() {
        close(STDIN_FILENO);
        if (former_ != -1) {
            dup2(former_, STDIN_FILENO);
            close(former_);
        }
    }
    FreedStandardInput(const FreedStandardInput&) = delete;
    FreedStandardInput& operator=(const FreedStandardInput&) = delete;

private:
    int former_;
};

} // namespace orvane::test
