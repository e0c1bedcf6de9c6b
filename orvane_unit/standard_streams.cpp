// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/standard_streams.h"

#include "kit/host/kit_error.h"

#include <fcntl.h>
#include <unistd.h>

#include <cerrno>
#include <csignal>
#include <cstddef>

namespace orvane::desk {

namespace {

struct StandardStream {
    int number;
    int otherWay; ///< the mode of access that its users do not ask for
};

constexpr StandardStream STANDARD_STREAMS[] = {
    {STDIN_FILENO, O_WRONLY}, {STDOUT_FILENO, O_RDONLY}, {STDERR_FILENO, O_RDONLY}};

bool isClosed(int descriptor) {
    return ::fcntl(descriptor, F_GETFD) == -1 && errno == EBADF;
}

} // namespace

void prepareStandardStreams() {
    for (const StandardStream& stream : STANDARD_STREAMS) {
        // The system gives the lowest number that is free, and those before this one are open.
        if (isClosed(stream.number) && ::open("/dev/null", stream.otherWay) != stream.number) {
            throw kit::systemError("cannot open /dev/null in place of a closed standard stream");
        }
    }
    static_cast<void>(std::signal(SIGPIPE, SIG_IGN));
}

void writeStandardOutput(const std::string& text) {
    std::size_t done = 0;
    while (done < text.size()) {
        const ssize_t count = ::write(STDOUT_FILENO, text.data() + done, text.size() - done);
        if (count < 0 && errno != EINTR) {
            throw kit::systemError("cannot write to standard output");
        }
        done += count < 0 ? 0 : static_cast<std::size_t>(count);
    }
}

} // namespace orvane::desk
