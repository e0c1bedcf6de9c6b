// SPDX-License-Identifier: Apache-2.0
//
// The two ways in which the configuration image ends the tool: its mapped bytes are gone.
#include "config/config_store.h"
#include "config/param_access.h"
#include "identity/vehicle_identity.h"
#include "kit/enter/captured_run.h"
#include "tests/support/full_memory.h"
#include "tests/support/host_command.h"
#include "tests/support/unit_test.h"

#include <gtest/gtest.h>
#include <unistd.h>

#include <csignal>
#include <cstdint>
#include <filesystem>
#include <string>
#include <vector>

namespace orvane::test {

namespace {

class LostImageTest : public UnitTest {};

TEST_F(LostImageTest, ImageThatIsCutOffWhileItIsMappedEndsTheProcess) {
    writeFile("/dev/null", ""); // for the child's standard input
    const kit::RunResult result = kit::runCaptured([] {
        static_cast<void>(std::signal(SIGBUS, SIG_DFL)); // a sanitizer may have its own
        ConfigStore store;
        std::uint8_t value = 0;
        if (store.open() == STORE_OPENED && ::truncate(IMAGE_PATH, 0) == 0) {
            getParamU8(store, MODEL_PARAM, &value);
        }
    });
    EXPECT_EQ(result.exitStatus, 128 + SIGBUS);
}

TEST_F(LostImageTest, ImageThatIsAHoleInFullMemoryEndsTheProcess) {
    leave();
    std::vector<std::string> command = holeInFullMemory(hostRoot());
    // Else a sanitizer reports the signal, and ends in its own way. It finds its options in /proc.
    std::filesystem::create_directory(hostRoot() / "proc");
    command.insert(command.end(), {"env", "ASAN_OPTIONS=handle_sigbus=0:detect_leaks=0"});
    for (const std::string& word : buildCommand(ORVANE_ENTER_BINARY)) {
        command.push_back(word);
    }
    command.insert(command.end(), {hostRoot().string(), ORVANE_BINARY, "-a"});
    const kit::RunResult result = runOnHost(command);
    EXPECT_EQ(result.exitStatus, 128 + SIGBUS) << result.standardError;
}

} // namespace

} // namespace orvane::test
