// SPDX-License-Identifier: Apache-2.0
//
// The program orvane-unit from its command line to its exit code.
#include "kit/capture.h"
#include "kit/kit_error.h"
#include "tests/support/folder_names.h"
#include "tests/support/host_command.h"
#include "tests/support/temporary_folder.h"
#include "tests/support/unit_test.h"

#include <gtest/gtest.h>
#include <linux/capability.h>
#include <sched.h>
#include <sys/prctl.h>
#include <unistd.h>

#include <algorithm>
#include <filesystem>
#include <set>
#include <string>
#include <vector>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;

using Words = std::vector<std::string>;

/// A unit whose run is told by one short file.
constexpr char DESCRIPTION[] = R"([files]
"/fs/mp/etc/airplay.conf" = "stock, no line end"
"/tmp/airplay.conf" = "stock, no line end"
"/tmp/other" = "not written"
)";

class OrvaneUnitTest : public ::testing::Test {
protected:
    const fs::path& folder() const { return folder_.path(); }
    std::string root() const { return folder() / "unit"; }
    std::string description() const { return folder() / "unit.toml"; }

    static Words commandLine(const Words& words) {
        Words command = buildCommand(ORVANE_UNIT_BINARY);
        command.insert(command.end(), words.begin(), words.end());
        return command;
    }

    static kit::RunResult start(const Words& words) { return runOnHost(commandLine(words)); }

    /// Makes the unit of the description above.
    void makeUnit() const {
        writeFile(description(), DESCRIPTION);
        expectRan(start({"new", root(), "--from", description()}),
                  "made " + root() + " from " + description() + "\n");
    }

    static void expectRan(const kit::RunResult& result, const std::string& output,
                          const std::string& error = "") {
        EXPECT_EQ(result.exitStatus, 0);
        EXPECT_EQ(result.standardOutput, output);
        EXPECT_EQ(result.standardError, error);
    }

    static void expectRefused(const Words& words, const std::string& complaint) {
        const kit::RunResult result = start(words);
        EXPECT_EQ(result.exitStatus, 2);
        EXPECT_EQ(result.standardOutput, "");
        EXPECT_EQ(result.standardError, "orvane-unit: " + complaint + "\n");
        EXPECT_EQ(std::count(result.standardError.begin(), result.standardError.end(), '\n'), 1);
    }

private:
    TemporaryFolder folder_;
};

TEST_F(OrvaneUnitTest, NewMakesTheSampleUnitAndRunListsWhatTheReadmeShows) {
    expectRan(start({"new", root()}), "made " + root() + " from the sample unit\n");
    const kit::RunResult result = start({"run", root(), "--", "-a", "-i"});
    EXPECT_EQ(result.exitStatus, 0);
    EXPECT_EQ(result.standardError, "");
    EXPECT_EQ(std::count(result.standardOutput.begin(), result.standardOutput.end(), '\n'), 6);
    EXPECT_NE(readFile(ORVANE_DOCS_DIR "/../README.md")
                  .find("\n$ orvane -a -i\n" + result.standardOutput + "```\n"),
              std::string::npos)
        << result.standardOutput;
}

TEST_F(OrvaneUnitTest, NewMakesTheDescribedUnit) {
    makeUnit();
    EXPECT_EQ(readFile(root() + "/fs/mp/etc/airplay.conf"), "stock, no line end");
    EXPECT_EQ(folderNames(root()), (std::set<std::string>{"dev", "fs", "tmp"}));
}

TEST_F(OrvaneUnitTest, RunListsWhatWasWrittenEvenWhenItIsAsBeforeAndShowPrintsIt) {
    makeUnit();
    const std::string list = "wrote /tmp/airplay.conf, 18 bytes\n";
    expectRan(start({"run", root(), "--", "-a"}), list);
    expectRan(start({"run", "--show", root(), "--", "-a"}),
              list + "==> /tmp/airplay.conf <==\nstock, no line end\n");
}

TEST_F(OrvaneUnitTest, ShowPrintsFilesInTheOrderOfTheListAndAddsNoSecondLineEnd) {
    writeFile(description(), "[files]\n\"/fs/mp/etc/iap2_device.cfg\" = \"d\\n\"\n"
                             "\"/fs/mp/etc/mm/iap2.cfg\" = \"t\\n\"\n"
                             "\"/fs/mp/etc/mm/iap1.cfg\" = \"unused\"\n"
                             "\"/fs/mp/etc/mm/iap1_static.cfg\" = \"end\\n\"\n");
    start({"new", root(), "--from", description()});
    const kit::RunResult result = start({"run", root(), "--show", "--", "-i"});
    const std::string generated = readFile(root() + "/tmp/iap1.cfg");
    expectRan(result, "wrote /tmp/iap1.cfg, " + std::to_string(generated.size()) +
                          " bytes\n"
                          "wrote /tmp/iap2.cfg, 2 bytes\n"
                          "wrote /tmp/iap2_device.cfg, 2 bytes\n"
                          "==> /tmp/iap1.cfg <==\n" +
                          generated +
                          "==> /tmp/iap2.cfg <==\nt\n"
                          "==> /tmp/iap2_device.cfg <==\nd\n");
}

TEST_F(OrvaneUnitTest, RunWithNothingWrittenSaysSoAndPassesOnTheToolsError) {
    makeUnit();
    expectRan(start({"run", root(), "--show", "--", "-x"}), "wrote nothing\n",
              "orvane: invalid option -- 'x'\n");
}

TEST_F(OrvaneUnitTest, RunWithoutWordsForTheToolGivesItNone) {
    makeUnit();
    expectRan(start({"run", root()}), "wrote nothing\n");
    EXPECT_EQ(readFile(root() + "/tmp/other"), "not written");
}

TEST_F(OrvaneUnitTest, ToolThatEndsWithAnotherStatusIsToldAndIsNoWrongUse) {
    makeUnit();
    expectRan(start({"run", root(), "--orvane", ORVANE_UNIT_BINARY, "--", "run", "/tmp/other"}),
              "wrote nothing\n",
              "orvane-unit: /tmp/other is not a folder\n"
              "orvane-unit: orvane ended with status 2\n");
}

TEST_F(OrvaneUnitTest, ToolIsFoundBesideTheProgramElseOnPath) {
    makeUnit();
    const fs::path alone = folder() / "alone/orvane-unit";
    const fs::path tools = folder() / "tools";
    fs::create_directory(alone.parent_path());
    fs::create_directory(tools);
    fs::copy_file(ORVANE_UNIT_BINARY, alone);
    fs::create_symlink(ORVANE_BINARY, tools / "orvane");
    const auto startAlone = [&](const std::string& path) {
        Words command = buildCommand(alone);
        command.insert(command.begin(), {"env", "PATH=" + path});
        command.insert(command.end(), {"run", root(), "--", "-a"});
        return runOnHost(command);
    };
    const kit::RunResult without = startAlone(":" + alone.parent_path().string());
    EXPECT_EQ(without.exitStatus, 2);
    EXPECT_EQ(without.standardError,
              "orvane-unit: there is no orvane beside this program or on PATH: name it with "
              "--orvane\n");
    expectRan(startAlone(alone.parent_path().string() + ":" + tools.string()),
              "wrote /tmp/airplay.conf, 18 bytes\n");
}

/// The privilege to change the root is gone for good, so the way leads through a user namespace; or
/// nowhere, with the remedy told, where the host allows none.
TEST_F(OrvaneUnitTest, RunNeedsNoPrivilegeWhereUserNamespacesAreAllowed) {
    makeUnit();
    const bool isAllowed = !HasFailure() &&
                           buildCommand("").size() == 1 && // an emulator has threads of its own
                           kit::runCaptured([] {
                               _exit(unshare(CLONE_NEWUSER) == 0 && chroot("/") == 0 ? 0 : 1);
                           }).exitStatus == 0;
    Words command = commandLine({"run", root(), "--", "-a"});
    const kit::RunResult result = kit::runCaptured([&command] {
        std::vector<char*> argv;
        for (std::string& word : command) {
            argv.push_back(word.data());
        }
        argv.push_back(nullptr);
        if (prctl(PR_CAPBSET_DROP, CAP_SYS_CHROOT) == 0 || geteuid() != 0) {
            execv(argv[0], argv.data());
        }
        throw kit::systemError("cannot start without privilege");
    });
    if (isAllowed) {
        expectRan(result, "wrote /tmp/airplay.conf, 18 bytes\n");
        return;
    }
    EXPECT_EQ(result.exitStatus, 2);
    EXPECT_NE(result.standardError.find("allow user namespaces"), std::string::npos);
    EXPECT_EQ(std::count(result.standardError.begin(), result.standardError.end(), '\n'), 1);
}

TEST_F(OrvaneUnitTest, NewRefusesAFolderThatIsNotEmptyAndLeavesIt) {
    fs::create_directory(root());
    writeFile(root() + "/mine", "kept");
    expectRefused({"new", root()}, root() + " is there already and is not an empty folder");
    EXPECT_EQ(folderNames(root()), (std::set<std::string>{"mine"}));
    EXPECT_EQ(readFile(root() + "/mine"), "kept");
}

TEST_F(OrvaneUnitTest, NewRefusesADescriptionThatIsMissingOrBadAndMakesNothing) {
    const std::string file = description();
    expectRefused({"new", root(), "--from", file},
                  "cannot read " + file + ": No such file or directory");
    writeFile(file, "[imago]\n");
    expectRefused({"new", root(), "--from", file},
                  file + ":1:2: unknown key \"imago\" in a unit: it takes folders, absent, image, "
                         "disk, files");
    writeFile(file, "[disk]\nsize = 10\n[disk.slots]\n9 = \"x\"\n");
    expectRefused({"new", root(), "--from", file}, "slot 9 does not fit on a disk of 10 bytes");
    expectRefused({"new", root(), "--from", folder()},
                  folder().string() + " is a folder, not a description");
    EXPECT_EQ(folderNames(folder()), (std::set<std::string>{"unit.toml"}));
}

TEST_F(OrvaneUnitTest, RunRefusesWhatIsNoUnit) {
    expectRefused({"run", root()}, root() + " is not a folder");
    fs::create_directory(root());
    expectRefused({"run", root(), "--", "-a"},
                  root() + " is not a unit: it has no fs, no dev and no tmp");
    EXPECT_TRUE(fs::is_empty(root()));
}

TEST_F(OrvaneUnitTest, RunRefusesAToolThatIsMissingOrNoProgram) {
    makeUnit();
    expectRefused({"run", root(), "--orvane", root() + "/orvane"},
                  "cannot read " + root() + "/orvane: No such file or directory");
    expectRefused({"run", root(), "--orvane", description()},
                  description() + " is not a little-endian ELF program");
}

TEST_F(OrvaneUnitTest, WrongUseIsRefused) {
    expectRefused({}, "A subcommand is required");
    expectRefused({"destroy"}, "A subcommand is required");
    expectRefused({"new"}, "ROOT is required");
    expectRefused({"new", root(), "--bogus"}, "The following argument was not expected: --bogus");
    expectRefused({"new", root(), root()}, "The following argument was not expected: " + root());
    expectRefused({"run", root(), "-a"}, "The following argument was not expected: -a");
    EXPECT_TRUE(fs::is_empty(folder()));
}

TEST_F(OrvaneUnitTest, ComplaintIsOneLineWhateverItIsAbout) {
    expectRefused({"run", "two\nlines"}, "two lines is not a folder");
}

TEST_F(OrvaneUnitTest, HelpExitsWithZero) {
    for (const Words& words : {Words{"--help"}, Words{"new", "--help"}, Words{"run", "-h"}}) {
        const kit::RunResult result = start(words);
        EXPECT_EQ(result.exitStatus, 0);
        EXPECT_NE(result.standardOutput.find("Usage: orvane-unit"), std::string::npos);
        EXPECT_EQ(result.standardError, "");
    }
}

} // namespace

} // namespace orvane::test
