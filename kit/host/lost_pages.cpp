// SPDX-License-Identifier: Apache-2.0
#include "kit/host/lost_pages.h"

#include "kit/host/kit_error.h"

#include <sys/mman.h>
#include <unistd.h>

#include <cerrno>
#include <csignal>
#include <cstddef>
#include <cstdint>
#include <string>

namespace orvane::kit {

namespace {

// What a signal handler needs can only be global.
// NOLINTBEGIN(*-non-const-global-variables)
volatile std::sig_atomic_t isAnyLost = 0;
std::size_t pageSize = 0;
// NOLINTEND(*-non-const-global-variables)

bool replaceByZeros(void* address) {
    const auto offset = reinterpret_cast<std::uintptr_t>(address) % pageSize;
    return ::mmap(static_cast<char*>(address) - offset, pageSize, PROT_READ,
                  MAP_PRIVATE | MAP_ANONYMOUS | MAP_FIXED, -1, 0) != MAP_FAILED;
}

/// The read that failed is repeated afterwards. If it can't succeed, it ends the process.
void handle(int signal, siginfo_t* info, void* /*context*/) {
    const int error = errno;
    if (info->si_code == BUS_ADRERR && replaceByZeros(info->si_addr)) {
        isAnyLost = 1;
    } else {
        static_cast<void>(::signal(signal, SIG_DFL));
        if (info->si_code <= 0) { // sent by a process: nothing is repeated
            static_cast<void>(::raise(signal));
        }
    }
    errno = error;
}

} // namespace

LostPages::LostPages() {
    isAnyLost = 0;
    pageSize = static_cast<std::size_t>(::sysconf(_SC_PAGESIZE));
    struct sigaction action {};
    action.sa_sigaction = handle;
    action.sa_flags = SA_SIGINFO;
    ::sigemptyset(&action.sa_mask);
    ::sigaction(SIGBUS, &action, &former_);
}

LostPages::~LostPages() {
    ::sigaction(SIGBUS, &former_, nullptr);
}

// It means nothing without an object.
// NOLINTNEXTLINE(readability-convert-member-functions-to-static)
void LostPages::requireNone(const std::filesystem::path& file) const {
    if (isAnyLost != 0) {
        throw KitError("cannot read ", file,
                       ": it was cut off meanwhile, or has a hole that its full file system can't "
                       "fill; orvane is ended there by SIGBUS");
    }
}

} // namespace orvane::kit
