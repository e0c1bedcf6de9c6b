// SPDX-License-Identifier: Apache-2.0
//
// A system that allows mappings of length 0: Linux does not, so strace answers instead.
#include "kit/enter/captured_run.h"
#include "tests/support/host_command.h"
#include "tests/support/temporary_folder.h"
#include "tests/support/unit_test.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <string>
#include <vector>

namespace orvane::test {

namespace {

constexpr char NOTHING_THERE[] = "0x1000"; // the first page is never mapped

class MappedNothingTest : public UnitTest {
protected:
    /// Runs `orvane -a`, and reports success to its attempts to map the image.
    std::string run() {
        leave();
        const TemporaryFolder folder;
        const std::string report = (folder.path() / "report").string();
        const std::string image = hostRoot().string() + IMAGE_PATH;
        std::filesystem::create_directory(hostRoot() / "proc"); // a sanitized product needs it
        const kit::RunResult result =
            runOnHost({"strace", "-E", "ASAN_OPTIONS=detect_leaks=0", "-f", "-qq", "-o", report,
                       "-P", image, "-e", "trace=mmap,mmap2", "-e",
                       std::string("inject=mmap,mmap2:retval=") + NOTHING_THERE,
                       ORVANE_ENTER_BINARY, hostRoot().string(), ORVANE_BINARY, "-a"});
        EXPECT_EQ(result.exitStatus, 0) << result.standardError;
        return readFile(report);
    }
};

// Rules: IMG-03
TEST_F(MappedNothingTest, EmptyImageCountsAsMissing) {
    if (sizeof ORVANE_EMULATOR != 1) {
        GTEST_SKIP() << "an emulator always maps whole pages";
    }
    writeImage("");
    writeFile("/fs/mp/etc/airplay_static.conf", "template\n");
    const std::string report = run();
    std::size_t injected = 0;
    for (std::size_t at = 0; (at = report.find("(INJECTED)", at)) != std::string::npos; ++at) {
        ++injected;
    }
    EXPECT_EQ(injected, 4U) << report; // model, brand, drive side, audio profile

    const std::string text = readFile((hostRoot() / "tmp/airplay.conf").string());
    EXPECT_NE(text.find("model = VOXA\n"), std::string::npos) << text;
    EXPECT_NE(text.find("/MARL/"), std::string::npos) << text;
    EXPECT_NE(text.find("rightHandDrive = 0\n\ntemplate\n"), std::string::npos) << text;
    EXPECT_EQ(text.find("audioProfile"), std::string::npos) << text;
}

} // namespace

} // namespace orvane::test
