// SPDX-License-Identifier: Apache-2.0
//
// SIGINT, SIGTERM and SIGHUP while there is something to clean up. No handler runs: the signals are
// blocked and wait, code that takes long asks for them and throws, and the process ends by the
// signal itself as soon as the last owner of something has removed it.
#pragma once

#include <signal.h>

namespace orvane::kit {

/// While one exists, the three signals wait, unless the process ignores them. When the outermost
/// one is destroyed, a signal that has come has its usual effect. Whoever owns something that must
/// not stay has this as its first member, so that it is destroyed last.
class DeferredInterruption {
public:
    DeferredInterruption();
    ~DeferredInterruption();
    DeferredInterruption(const DeferredInterruption&) = delete;
    DeferredInterruption& operator=(const DeferredInterruption&) = delete;

private:
    sigset_t former_{};
};

/// The three signals without those that the process ignores.
sigset_t interruptions();

/// Throws KitError when one of the signals waits.
void throwIfInterrupted();

/// For a child that becomes another program: the signals no longer wait.
void allowInterruption();

} // namespace orvane::kit
