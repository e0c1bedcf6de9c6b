// SPDX-License-Identifier: Apache-2.0
#include "kit/enter/captured_run.h"
#include "kit/host/kit_error.h"
#include "tests/kit/host/open_descriptors.h"
#include "tests/support/host_command.h"

#include <gtest/gtest.h>
#include <sys/types.h>
#include <unistd.h>

#include <csignal>
#include <cstddef>
#include <string>

namespace orvane::test {

namespace {

void say(int descriptor, const std::string& text) {
    ASSERT_EQ(write(descriptor, text.data(), text.size()), static_cast<ssize_t>(text.size()));
}

TEST(CapturedRunTest, LargeOutputIsWhole) {
    const std::string text(3 << 20U, 'x');
    const kit::RunResult result = kit::runCaptured([&text] {
        say(STDOUT_FILENO, text);
        say(STDERR_FILENO, text + "!");
        _exit(0);
    });
    EXPECT_TRUE(result.standardOutput == text) << result.standardOutput.size() << " bytes";
    EXPECT_TRUE(result.standardError == text + "!") << result.standardError.size() << " bytes";
}

TEST(CapturedRunTest, ZerosOfASparseOutputAreKept) {
    const kit::RunResult result = kit::runCaptured([] {
        say(STDOUT_FILENO, "a");
        EXPECT_EQ(ftruncate(STDOUT_FILENO, 1 << 20U), 0);
        say(STDOUT_FILENO, "b");
        _exit(0);
    });
    EXPECT_TRUE(result.standardOutput == "a" + std::string((1 << 20U) - 1, '\0') + "b")
        << result.standardOutput.size() << " bytes";
}

TEST(CapturedRunTest, OutputOpenedByNameHasNoHole) {
    const kit::RunResult result =
        runOnHost({"sh", "-c", "echo first >&2; echo second >/dev/stderr; echo third >&2"});
    EXPECT_EQ(result.standardError, "second\nthird\n");
}

TEST(CapturedRunTest, SurvivingChildIsNotWaitedFor) {
    for (const std::string outputs : {"", ">/dev/null 2>&1"}) {
        const kit::RunResult result =
            runOnHost({"sh", "-c", "sleep 600 " + outputs + " & echo $!"});
        const pid_t sleeper = std::stoi(result.standardOutput);
        EXPECT_EQ(kill(sleeper, SIGKILL), 0) << "it has already ended";
    }
}

TEST(CapturedRunTest, FailedStartIsThrownNotCaptured) {
    const std::size_t before = openDescriptors();
    try {
        kit::runCaptured([] {
            say(STDERR_FILENO, "said before");
            throw kit::KitError("no such program");
        });
        ADD_FAILURE() << "started";
    } catch (const kit::KitError& error) {
        EXPECT_STREQ(error.what(), "no such program");
    }
    EXPECT_EQ(openDescriptors(), before);
}

TEST(CapturedRunTest, ProgramMayExitLikeAFailedStart) {
    EXPECT_EQ(runOnHost({"sh", "-c", "exit 127"}).exitStatus, 127);
}

} // namespace

} // namespace orvane::test
