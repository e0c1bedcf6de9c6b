// SPDX-License-Identifier: Apache-2.0
//
// A program that runs in a unit finds no way to the host.
#include "kit/enter/captured_run.h"
#include "kit/enter/run_inside.h"
#include "kit/host/descriptor.h"
#include "kit/host/kit_error.h"
#include "tests/support/folder_names.h"
#include "tests/support/temporary_folder.h"
#include "tests/support/unit_test.h"

#include <fcntl.h>
#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <regex>
#include <set>
#include <string>
#include <vector>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;

constexpr char NO_PROC[] = "descriptors: 0 1 2\nworking directory: /\nabove it: /\n"
                           "/proc: No such file or directory\n"
                           "/proc/self/cwd/: No such file or directory\n"
                           "/proc/self/root/: No such file or directory\n";

/// A unit with a folder of its own, in a process with a descriptor that leads out.
class WayOutTest : public ::testing::TestWithParam<const char*> {
protected:
    WayOutTest() { fs::create_directory(root() / "tmp"); }

    const fs::path& root() const { return folder_.path(); }

    /// What the program finds. The name of the folder with the program's own files differs in each
    /// run.
    std::string found() const {
        const kit::RunResult result = kit::runInside(root(), {GetParam(), {}});
        EXPECT_EQ(result.exitStatus, 0);
        EXPECT_EQ(result.standardError, "");
        return std::regex_replace(result.standardOutput, std::regex(" [.]program[.]\\S*"), "");
    }

private:
    TemporaryFolder folder_;
    kit::Descriptor wayOut_{::open("/", O_PATH | O_DIRECTORY)}; // inherited by other programs
};

TEST_P(WayOutTest, ProgramFindsOnlyTheUnit) {
    EXPECT_EQ(found(), std::string(NO_PROC) + "/: . .. tmp\n");
    EXPECT_EQ(folderNames(root()), std::set<std::string>{"tmp"});
}

TEST_P(WayOutTest, ProcIsTheUnitsOwn) {
    fs::create_directories(root() / "proc/self");
    fs::create_directory_symlink("/tmp", root() / "proc/self/cwd");
    fs::create_directory_symlink("/", root() / "proc/self/root");
    EXPECT_EQ(found(), "descriptors: 0 1 2\nworking directory: /\nabove it: /\n"
                       "/proc: . .. self\n/proc/self/cwd/: . ..\n/proc/self/root/: . .. proc tmp\n"
                       "/: . .. proc tmp\n");
}

INSTANTIATE_TEST_SUITE_P(Programs, WayOutTest,
                         ::testing::ValuesIn(std::vector<const char*>{
                             ORVANE_LOOK_AROUND_BINARIES}));

/// In a sanitized build, the product sees the host's /proc, but its working directory is the unit.
TEST(WayOutOfALinkTest, LinkToTheWorkingDirectoryLeadsNowhereElse) {
    const TemporaryFolder folder;
    const TemporaryFolder elsewhere;
    const fs::path root = folder.path() / "unit";
    const std::string name = elsewhere.path().filename().string() + "-planted";
    fs::create_directories(root / "tmp");
    fs::create_symlink("/proc/self/cwd/" + name, root / "tmp/airplay.conf");
    fs::create_symlink("/proc/self/cwd/" + elsewhere.path().relative_path().string() + "/planted",
                       root / "tmp/iap2.cfg");
    const fs::path before = fs::current_path();
    fs::current_path(elsewhere.path());
    kit::runInside(root, {ORVANE_BINARY, {"-a", "-i"}});
    fs::current_path(before);
    EXPECT_FALSE(fs::remove("/" + name));
    EXPECT_TRUE(fs::is_empty(elsewhere.path()));
}

/// A loader reads this file of the unit, and runs what it names.
TEST(WayOutOfALoaderTest, UnitCannotAddCodeToADynamicProgram) {
    const TemporaryFolder folder;
    fs::create_directory(folder.path() / "etc");
    writeFile(folder.path() / "etc/ld.so.preload", "/tmp/code.so\n");
    try {
        kit::runInside(folder.path(), {"/bin/sh", {"-c", "exit 0"}});
        ADD_FAILURE() << "ran";
    } catch (const kit::KitError& error) {
        EXPECT_EQ(error.text(), "the unit has /etc/ld.so.preload, which adds code to a dynamic "
                                "program: link it with -static to run it here");
    }
    EXPECT_EQ(folderNames(folder.path()), std::set<std::string>{"etc"});
}

} // namespace

} // namespace orvane::test
