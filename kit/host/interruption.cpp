// SPDX-License-Identifier: Apache-2.0
#include "kit/host/interruption.h"

#include "kit/host/kit_error.h"

#include <memory>

namespace orvane::kit {

namespace {

constexpr int INTERRUPTIONS[] = {SIGINT, SIGTERM, SIGHUP};

/// As under nohup, or in the background of a script.
bool isIgnored(int signal) {
    struct sigaction action {};
    return ::sigaction(signal, nullptr, &action) == 0 && action.sa_handler == SIG_IGN;
}

} // namespace

sigset_t interruptions() {
    sigset_t signals{};
    ::sigemptyset(&signals);
    for (const int signal : INTERRUPTIONS) {
        if (!isIgnored(signal)) { // one that is blocked would no longer be dropped, but wait
            ::sigaddset(&signals, signal);
        }
    }
    return signals;
}

DeferredInterruption::DeferredInterruption() {
    const sigset_t signals = interruptions();
    ::sigprocmask(SIG_BLOCK, &signals, &former_);
}

DeferredInterruption::~DeferredInterruption() {
    ::sigprocmask(SIG_SETMASK, &former_, nullptr);
}

void throwIfInterrupted() {
    const sigset_t signals = interruptions();
    sigset_t waiting{};
    ::sigpending(&waiting);
    for (const int signal : INTERRUPTIONS) {
        if (::sigismember(&signals, signal) == 1 && ::sigismember(&waiting, signal) == 1) {
            throw KitError("interrupted");
        }
    }
}

void allowInterruption() {
    const sigset_t signals = interruptions();
    ::sigprocmask(SIG_UNBLOCK, &signals, nullptr);
}

} // namespace orvane::kit
