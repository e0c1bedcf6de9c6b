// SPDX-License-Identifier: Apache-2.0
//
// Each case runs in a child of its own, since the signals end it.
#include "kit/enter/captured_run.h"
#include "kit/host/interruption.h"
#include "kit/host/kit_error.h"

#include <gtest/gtest.h>
#include <signal.h>
#include <unistd.h>

#include <functional>
#include <optional>
#include <string>

namespace orvane::test {

namespace {

void print(const std::string& text) {
    EXPECT_EQ(write(STDOUT_FILENO, text.data(), text.size()), static_cast<ssize_t>(text.size()));
}

kit::RunResult runChild(const std::function<void()>& child) {
    return kit::runCaptured([&child] {
        child();
        _exit(0);
    });
}

class InterruptionTest : public ::testing::TestWithParam<int> {};

TEST_P(InterruptionTest, SignalWaitsForTheOutermostOwner) {
    const kit::RunResult result = runChild([] {
        std::optional<kit::DeferredInterruption> outer(std::in_place);
        {
            const kit::DeferredInterruption inner;
            static_cast<void>(raise(GetParam()));
        }
        print("in time");
        outer.reset();
        print(", too late");
    });
    EXPECT_EQ(result.exitStatus, 128 + GetParam());
    EXPECT_EQ(result.standardOutput, "in time");
}

TEST_P(InterruptionTest, WaitingSignalIsThrownWhenAskedFor) {
    const kit::RunResult result = runChild([] {
        const kit::DeferredInterruption deferred;
        kit::throwIfInterrupted();
        static_cast<void>(raise(GetParam()));
        try {
            kit::throwIfInterrupted();
        } catch (const kit::KitError& error) {
            print(error.what());
        }
    });
    EXPECT_EQ(result.exitStatus, 128 + GetParam());
    EXPECT_EQ(result.standardOutput, "interrupted");
}

TEST_P(InterruptionTest, IgnoredSignalStaysIgnored) {
    const kit::RunResult result = runChild([] {
        static_cast<void>(signal(GetParam(), SIG_IGN));
        {
            const kit::DeferredInterruption deferred;
            static_cast<void>(raise(GetParam()));
            kit::throwIfInterrupted();
        }
        print("still here");
    });
    EXPECT_EQ(result.exitStatus, 0);
    EXPECT_EQ(result.standardOutput, "still here");
}

TEST_P(InterruptionTest, ChildThatBecomesAProgramCanBeInterrupted) {
    const kit::DeferredInterruption deferred;
    const kit::RunResult result = runChild([] { static_cast<void>(raise(GetParam())); });
    EXPECT_EQ(result.exitStatus, 128 + GetParam());
}

INSTANTIATE_TEST_SUITE_P(Signals, InterruptionTest, ::testing::Values(SIGINT, SIGTERM, SIGHUP));

} // namespace

} // namespace orvane::test
