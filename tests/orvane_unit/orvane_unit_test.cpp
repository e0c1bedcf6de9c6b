// SPDX-License-Identifier: Apache-2.0
//
// The program orvane-unit from its command line to its exit status.
#include "kit/description/unit_layout.h"
#include "kit/enter/captured_run.h"
#include "kit/host/kit_error.h"
#include "kit/host/text.h"
#include "kit/unit/marker.h"
#include "tests/kit/unit/described_unit.h"
#include "tests/orvane_unit/orvane_unit_command.h"
#include "tests/support/full_memory.h"
#include "tests/support/unit_test.h"

#include <linux/capability.h>
#include <sched.h>
#include <sys/prctl.h>
#include <unistd.h>

#include <algorithm>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;

void expectRan(const kit::RunResult& result, int status, const std::string& output,
               const std::string& error = "") {
    EXPECT_EQ(result.exitStatus, status);
    EXPECT_EQ(result.standardOutput, output);
    EXPECT_EQ(result.standardError, error);
}

void expectRefused(const Words& words, const std::string& complaint) {
    expectRan(runOrvaneUnit(words), 2, "", "orvane-unit: " + complaint + "\n");
}

const Words COMMANDS = {"new",  "describe", "set",    "show",    "explain", "run",
                        "diff", "impact",   "report", "capture", "check"};

TEST(OrvaneUnitTest, HelpOfEveryCommandHasAnExample) {
    const kit::RunResult help = runOrvaneUnit({"--help"});
    EXPECT_EQ(help.exitStatus, 0);
    EXPECT_EQ(help.standardError, "");
    for (const std::string& command : COMMANDS) {
        EXPECT_NE(help.standardOutput.find("\n  " + command + " "), std::string::npos) << command;
        const kit::RunResult result = runOrvaneUnit({command, "--help"});
        EXPECT_EQ(result.exitStatus, 0) << command;
        EXPECT_NE(result.standardOutput.find("Example:\n  orvane-unit " + command),
                  std::string::npos)
            << command;
    }
}

TEST(OrvaneUnitTest, WrongUseIsRefused) {
    const std::string commands = "the first word must be one of new, describe, set, show, explain, "
                                 "run, diff, impact, report, capture, check";
    expectRefused({}, commands);
    for (const std::string word : {"wash", "Explain", "--bogus", "--json", "--", "-v", ""}) {
        expectRefused({word, "show"},
                      std::string(commands).append(": not ").append(kit::inQuotes(word)));
    }
    expectRefused({"run", "a", "-a"}, "run does not take \"-a\"; orvane's own options follow --");
    expectRefused({"new", "a", "b", "c", "-x"}, "new does not take \"b\", \"c\", \"-x\"");
    for (const Words& words :
         {Words{"explain", "a", "--content"}, Words{"new"}, Words{"show", "a", "--json=no"},
          Words{"diff", "a"}, Words{"show", "a", "--only", "engine"}, Words{"run", "a", "--wrong"},
          Words{"set", "a"}}) {
        const kit::RunResult result = runOrvaneUnit(words);
        EXPECT_EQ(result.exitStatus, 2);
        EXPECT_EQ(result.standardOutput, "");
        EXPECT_EQ(result.standardError.compare(0, 13, "orvane-unit: "), 0) << result.standardError;
    }
}

TEST(OrvaneUnitTest, NewMakesTheDescribedOrTheSampleUnit) {
    const TemporaryFolder folder;
    const std::string description = folder.path() / "unit.toml";
    writeFile(description, "[files]\n\"/tmp/old\" = \"text\"\n");
    expectRan(runOrvaneUnit({"new", folder.path() / "one", "--from", description}), 0, "");
    EXPECT_EQ(readFile(folder.path() / "one/tmp/old"), "text");
    expectRan(runOrvaneUnit({"new", folder.path() / "two"}), 0, "");
    EXPECT_TRUE(exists(folder.path() / "two/fs/mp/etc/airplay_static.conf"));
}

TEST(OrvaneUnitTest, NewMakesNothingFromABadDescription) {
    const TemporaryFolder folder;
    const std::string description = folder.path() / "unit.toml";
    const std::string root = folder.path() / "unit";
    writeFile(description, "[image.params]\n134 = 70000\n");
    expectRefused({"new", root, "--from", description},
                  description + ":2:7: parameter 134 is two bytes: 70000 does not fit");
    EXPECT_FALSE(exists(root));
}

TEST(OrvaneUnitTest, DescriptionMakesTheSameUnitAgain) {
    const DescribedUnit described;
    const kit::RunResult result = runOrvaneUnit({"describe", described.root()});
    EXPECT_EQ(result.exitStatus, 0);
    const std::string description = described.folder() / "unit.toml";
    writeFile(description, result.standardOutput);
    const std::string again = described.folder() / "again";
    expectRan(runOrvaneUnit({"new", again, "--from", description}), 0, "");
    expectRan(runOnHost({"diff", "-r", described.root(), again}), 0, "");
}

TEST(OrvaneUnitTest, SetChangesAllOrNothing) {
    const DescribedUnit described;
    const std::string root = described.root();
    expectRan(runOrvaneUnit({"set", root, "param.22=0", "serial=SN9"}), 0, "");
    expectRefused({"set", root, "param.22=1", "param.139=300"},
                  "param.139=300: parameter 139 is one byte: 300 does not fit");
    const kit::RunResult shown = runOrvaneUnit({"explain", root, "-a", "-i"});
    EXPECT_NE(shown.standardOutput.find("rightHandDrive = 0"), std::string::npos);
    EXPECT_NE(shown.standardOutput.find("serial=SN9"), std::string::npos);
}

TEST(OrvaneUnitTest, ExplainSaysNoForADefault) {
    const DescribedUnit described;
    EXPECT_EQ(runOrvaneUnit({"explain", described.root()}).exitStatus, 0);
    runOrvaneUnit({"set", described.root(), "param.139=0"});
    EXPECT_EQ(runOrvaneUnit({"explain", described.root(), "-i"}).exitStatus, 1);
    EXPECT_EQ(runOrvaneUnit({"explain", described.root(), "-i", "--json"}).exitStatus, 1);
}

TEST(OrvaneUnitTest, DiffSaysNoForADifference) {
    const DescribedUnit first;
    const DescribedUnit second([](kit::UnitDescription& unit) { unit.image.params[50] = 1; });
    expectRan(runOrvaneUnit({"diff", first.root(), first.root()}), 0, "");
    expectRan(runOrvaneUnit({"diff", first.root(), second.root()}), 1,
              "param.50: 0 -> 1\n  changes no output\n");
}

TEST(OrvaneUnitTest, RunShowsADiffOrOnlyNames) {
    const DescribedUnit described([](kit::UnitDescription& unit) {
        unit.files.erase("/fs/mp/etc/airplay_static.conf");
        unit.files["/tmp/airplay.conf"] = "older\n";
        unit.files["/tmp/other"] = "not written\n";
    });
    const std::string root = described.root();
    expectRan(runOrvaneUnit({"run", root, "--", "-a"}), 0,
              "--- /tmp/airplay.conf\n+++ /tmp/airplay.conf\n@@ -1,1 +1,1 @@\n-older\n"
              "+airplay stock\n");
    expectRan(runOrvaneUnit({"run", root, "--", "-a"}), 0, ""); // the same again
    expectRan(runOrvaneUnit({"run", root, "--brief", "--", "-i"}), 0,
              "made /tmp/iap1.cfg, 254 bytes\nmade /tmp/iap2.cfg, 239 bytes\n"
              "made /tmp/iap2_device.cfg, 263 bytes\n");
}

TEST(OrvaneUnitTest, RunPassesOnTheToolsMessages) {
    const DescribedUnit described;
    const kit::RunResult result = runOrvaneUnit({"run", described.root(), "--", "-x"});
    EXPECT_EQ(result.exitStatus, 0);
    EXPECT_EQ(result.standardOutput, "");
    EXPECT_NE(result.standardError.find("'x'"), std::string::npos);
}

TEST(OrvaneUnitTest, OtherExitStatusOfTheToolIsANo) {
    const DescribedUnit described;
    expectRan(runOrvaneUnit({"run", described.root(), "--orvane", "/bin/false"}), 1, "",
              "orvane-unit: orvane ended with exit status 1\n");
}

TEST(OrvaneUnitTest, RunNeedsAnExistingTool) {
    const DescribedUnit described;
    const kit::RunResult result =
        runOrvaneUnit({"run", described.root(), "--orvane", described.folder() / "none"});
    EXPECT_EQ(result.exitStatus, 2);
    EXPECT_EQ(result.standardOutput, "");
    EXPECT_NE(result.standardError, "");
}

TEST(OrvaneUnitTest, ToolIsFoundBesideTheProgramOrOnPath) {
    const DescribedUnit described;
    const fs::path alone = described.folder() / "alone/orvane-unit";
    const fs::path tools = described.folder() / "tools";
    fs::create_directory(alone.parent_path());
    fs::create_directory(tools);
    fs::copy_file(ORVANE_UNIT_BINARY, alone);
    fs::create_symlink(ORVANE_BINARY, tools / "orvane");
    const auto startAlone = [&](const std::string& path) {
        Words command = buildCommand(alone);
        command.insert(command.begin(), {"env", "-C", alone.parent_path(), "PATH=" + path});
        command.insert(command.end(), {"run", described.root(), "--brief", "--", "-i"});
        return runOnHost(command);
    };
    expectRan(startAlone(":" + alone.parent_path().string()), 2, "",
              "orvane-unit: orvane is neither beside orvane-unit nor on PATH: name it with "
              "--orvane\n");
    EXPECT_EQ(startAlone(alone.parent_path().string() + ":" + tools.string()).exitStatus, 0);
    EXPECT_TRUE(exists(described.root() / "tmp/iap2.cfg"));
}

/// The privilege to change the root is gone for good, so the program needs a user namespace; if the
/// host allows none, the program names the remedy.
TEST(OrvaneUnitTest, RunNeedsNoPrivilegeWhereUserNamespacesAreAllowed) {
    const DescribedUnit described;
    const bool isAllowed = buildCommand("").size() == 1 && // an emulator has its own threads
                           kit::runCaptured([] {
                               _exit(unshare(CLONE_NEWUSER) == 0 && chroot("/") == 0 ? 0 : 1);
                           }).exitStatus == 0;
    Words command = orvaneUnit({"run", described.root(), "--brief", "--", "-a"});
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
        EXPECT_EQ(result.exitStatus, 0) << result.standardError;
        EXPECT_TRUE(exists(described.root() / "tmp/airplay.conf"));
        return;
    }
    EXPECT_EQ(result.exitStatus, 2);
    EXPECT_NE(result.standardError.find("allow user namespaces"), std::string::npos);
}

TEST(OrvaneUnitTest, CommandsThatWriteRefuseFoldersWithoutTheMark) {
    const DescribedUnit described;
    const std::string root = described.root();
    fs::remove(described.root() / kit::MARKER_NAME);
    for (const Words& words :
         {Words{"run", root, "--", "-a"}, Words{"set", root, "param.1=1"}, Words{"run", "/"},
          Words{"set", "/", "param.1=1"}, Words{"new", "/"}, Words{"capture", root, "/"}}) {
        const kit::RunResult result = runOrvaneUnit(words);
        EXPECT_EQ(result.exitStatus, 2) << words[0] << ' ' << words[1];
        EXPECT_EQ(result.standardOutput, "");
    }
    EXPECT_FALSE(exists(root + "/tmp/airplay.conf"));
}

TEST(OrvaneUnitTest, CaptureReplaysAUnit) {
    const DescribedUnit described;
    const std::string field = described.folder() / "field";
    expectRan(runOrvaneUnit({"capture", described.root(), field, "--redact-serial"}), 0, "");
    EXPECT_EQ(fs::file_size(field + "/dev/hd0"), MEBIBYTE);
    expectRan(runOrvaneUnit({"diff", described.root(), field}), 1,
              "slot.9: SN004217 -> XXXXXXXX\n"
              "  /tmp/iap2_device.cfg\n    -serial=SN004217\n    +serial=XXXXXXXX\n"
              "  /tmp/iap2.cfg\n    -serial=SN004217\n    +serial=XXXXXXXX\n"
              "  /tmp/iap1.cfg\n    -serial=SN004217\n    +serial=XXXXXXXX\n");
}

TEST(OrvaneUnitTest, CheckSaysNoWithoutAnExpectation) {
    const TemporaryFolder folder;
    fs::create_directory(folder.path() / "one");
    writeFile(folder.path() / "one/unit.toml", "");
    EXPECT_EQ(runOrvaneUnit({"check", folder.path()}).exitStatus, 1);
    EXPECT_EQ(runOrvaneUnit({"check", folder.path(), "--update"}).exitStatus, 0);
    EXPECT_EQ(runOrvaneUnit({"check", folder.path()}).exitStatus, 0);
    EXPECT_EQ(runOrvaneUnit({"check", folder.path() / "one"}).exitStatus, 2);
}

bool isColoured(const kit::RunResult& result) {
    EXPECT_EQ(result.exitStatus, 0) << result.standardError;
    EXPECT_NE(result.standardOutput, "");
    return result.standardOutput.find('\033') != std::string::npos;
}

/// Runs the words as if standard output were a terminal: strace makes every ioctl succeed.
/// `noColour` is NAME to unset, or NAME=VALUE to set.
kit::RunResult startAsOnATerminal(const std::string& noColour, const Words& words) {
    Words command = {"strace", "-qq", "-o", "/dev/null", "-e", "inject=ioctl:retval=0",
                     // LeakSanitizer would trace the process as well
                     "-E", "ASAN_OPTIONS=detect_leaks=0", "-E", noColour};
    return runOnHost(command + orvaneUnit(words));
}

TEST(OrvaneUnitTest, OutputIsColouredOnlyOnATerminal) {
    const DescribedUnit described;
    const Words words = {"explain", described.root()};
    EXPECT_FALSE(isColoured(runOrvaneUnit(words)));
    if (buildCommand(ORVANE_UNIT_BINARY).size() > 1) {
        return; // in a cross build; the native builds test this
    }
    EXPECT_TRUE(isColoured(startAsOnATerminal("NO_COLOR", words)));
    EXPECT_FALSE(isColoured(startAsOnATerminal("NO_COLOR=1", words)));
    EXPECT_TRUE(isColoured(startAsOnATerminal("NO_COLOR=", words)));
}

TEST(OrvaneUnitTest, ImageThatIsAHoleInFullMemoryEndsNoCommand) {
    const DescribedUnit described;
    const std::string root = described.root();
    const std::string other = described.folder() / "other";
    expectRan(runOrvaneUnit({"new", other}), 0, "");
    const std::string image = "/fs/tmpfs/VS_DIAG_SERVICE_CONFIG_SHARED_MEM";
    const std::string complaint =
        "orvane-unit: cannot read " + image +
        ": it was cut off meanwhile, or has a hole that its full file system can't fill; orvane is "
        "ended there by SIGBUS\n";
    const auto startInFullMemory = [&root](const Words& words) {
        Words command = holeInFullMemory(root);
        for (const std::string& word : orvaneUnit(words)) {
            command.push_back(word);
        }
        return runOnHost(command);
    };
    for (const Words& words : {Words{"explain", root}, Words{"explain", root, "-i", "--json"},
                               Words{"show", root}, Words{"show", root, "--only", "records"},
                               Words{"diff", root, other}, Words{"diff", other, root}}) {
        expectRan(startInFullMemory(words), 2, "", complaint);
    }
    const std::string field = described.folder() / "field";
    expectRan(startInFullMemory({"capture", root, field}), 0, "");
    expectRan(startInFullMemory({"set", root, "param.22=1"}), 2, "",
              "orvane-unit: param.22=1: cannot write " + image + ": No space left on device\n");
    expectRan(runOnHost({"cmp", field + image, "-n", "179", "/dev/zero"}), 0, "");
    EXPECT_EQ(startInFullMemory({"impact", root, "param.22"}).exitStatus, 0);
    EXPECT_EQ(startInFullMemory({"describe", root}).exitStatus, 0);
}

TEST(OrvaneUnitTest, ShortSerialIsNotRedacted) {
    const DescribedUnit described;
    expectRan(runOrvaneUnit({"set", described.root(), "serial=AB1"}), 0, "");
    const std::string field = described.folder() / "field";
    expectRefused({"capture", described.root(), field, "--redact-serial"},
                  "a serial of 3 bytes can't be redacted: so few bytes also stand in other places "
                  "by chance");
    EXPECT_FALSE(exists(field));
}

} // namespace

} // namespace orvane::test
