// SPDX-License-Identifier: Apache-2.0
//
// The program orvane-unit when it is interrupted, killed, started twice at once, or without room:
// nothing is lost, nothing is left.
#include "kit/enter/captured_run.h"
#include "kit/host/folder_lock.h"
#include "tests/kit/unit/described_unit.h"
#include "tests/orvane_unit/orvane_unit_command.h"
#include "tests/support/folder_names.h"
#include "tests/support/holder_named.h"
#include "tests/support/resource_limit.h"
#include "tests/support/temporary_folder.h"
#include "tests/support/unit_test.h"

#include <gtest/gtest.h>
#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

#include <filesystem>
#include <fstream>
#include <optional>
#include <regex>
#include <set>
#include <string>
#include <vector>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;

/// A unit, a folder of one case, and a folder for the program's temporary files.
class NothingLostTest : public ::testing::Test {
protected:
    NothingLostTest() {
        fs::create_directories(folder() / "cases/one");
        fs::create_directory(temporary());
        writeFile(folder() / "cases/one/unit.toml", "");
    }

    const fs::path& folder() const { return unit_.folder(); }
    std::string unit() const { return unit_.root(); }
    fs::path temporary() const { return folder() / "temporary"; }

    std::string explained() const {
        return runOnHost(orvaneUnit({"explain", unit()})).standardOutput;
    }

private:
    DescribedUnit unit_;
};

/// With strace, which would see the calls of an emulator.
class NothingLostTracedTest : public NothingLostTest {
protected:
    void SetUp() override {
        if (buildCommand(ORVANE_UNIT_BINARY).size() > 1) {
            GTEST_SKIP() << "the native builds test this";
        }
    }

    /// Runs a command under strace, which does `injection` (its option of that name).
    kit::RunResult injected(const std::string& injection, const Words& words) const {
        return runOnHost(
            Words{"strace", "-qq", "-o", "/dev/null", "-e", "inject=" + injection, "-E",
                  "ASAN_OPTIONS=detect_leaks=0", // LeakSanitizer would trace the process, too
                  "-E", "TMPDIR=" + temporary().string()} +
            orvaneUnit(words));
    }

    /// Runs the program, and lets the system send it `signal` at its first call of `systemCall`.
    kit::RunResult interrupted(const std::string& systemCall, const std::string& signal,
                               const Words& words) const {
        return injected(systemCall + ":signal=" + signal + ":when=1", words);
    }
};

struct Interruption {
    const char* name;
    int number;
};
constexpr Interruption INTERRUPTIONS_TRIED[] = {
    {"SIGINT", SIGINT}, {"SIGTERM", SIGTERM}, {"SIGHUP", SIGHUP}};

TEST_F(NothingLostTracedTest, InterruptedCommandsLeaveNothing) {
    fs::create_directory(folder() / "empty");
    const std::set<std::string> before = folderNames(folder());
    const std::string cases = folder() / "cases";
    for (const Interruption& signal : INTERRUPTIONS_TRIED) {
        SCOPED_TRACE(signal.name);
        const auto expectInterrupted = [&](const char* systemCall, const Words& words) {
            SCOPED_TRACE(words[0]);
            const kit::RunResult result = interrupted(systemCall, signal.name, words);
            EXPECT_EQ(result.exitStatus, 128 + signal.number);
            EXPECT_EQ(result.standardOutput + result.standardError, "");
            EXPECT_EQ(folderNames(folder()), before);
            EXPECT_EQ(folderNames(folder() / "empty"), std::set<std::string>{});
            EXPECT_EQ(folderNames(temporary()), std::set<std::string>{});
        };
        expectInterrupted("ftruncate", {"new", folder() / "made"});
        expectInterrupted("ftruncate", {"new", folder() / "empty"});
        expectInterrupted("ftruncate", {"capture", unit(), folder() / "made"});
        expectInterrupted("ftruncate", {"impact", unit()});
        expectInterrupted("pwrite64", {"impact", unit()});
        expectInterrupted("ftruncate", {"check", cases});
        expectInterrupted("wait4", {"check", cases});
        expectInterrupted("wait4", {"run", unit(), "--", "-a"});
        expectInterrupted("flock", {"new", folder() / "made"});
    }
}

/// Whether a program runs with this argument, other than orvane-unit itself.
bool isRunning(const std::string& argument) {
    for (const fs::directory_entry& process : fs::directory_iterator("/proc")) {
        std::ifstream file(process.path() / "cmdline");
        std::string words;
        std::getline(file, words);
        if (words.find(argument) != std::string::npos &&
            words.find("orvane-unit") == std::string::npos) {
            return true;
        }
    }
    return false;
}

pid_t startInBackground(Words command) {
    const pid_t child = fork();
    if (child == 0) {
        std::vector<char*> argv;
        for (std::string& word : command) {
            argv.push_back(word.data());
        }
        argv.push_back(nullptr);
        execvp(argv[0], argv.data());
        _exit(1);
    }
    return child;
}

TEST_F(NothingLostTest, InterruptionAndKillEndTheProgramThatRuns) {
    const std::string forever = std::to_string(100000000 + getpid());
    const std::set<std::string> before = folderNames(unit());
    for (const int signal : {SIGTERM, SIGKILL}) {
        SCOPED_TRACE(signal);
        const pid_t started =
            startInBackground(orvaneUnit({"run", unit(), "--orvane", "/bin/sleep", "--", forever}));
        int status = 0;
        while (!isRunning(forever)) {
            ASSERT_EQ(waitpid(started, &status, WNOHANG), 0) << status;
        }
        kill(started, signal);
        EXPECT_EQ(waitpid(started, &status, 0), started);
        EXPECT_TRUE(WIFSIGNALED(status) && WTERMSIG(status) == signal) << status;
        while (signal == SIGKILL && isRunning(forever)) { // the system is about to kill it
        }
        EXPECT_FALSE(isRunning(forever));
        EXPECT_EQ(folderNames(unit()) == before, signal == SIGTERM);
    }
    // The program and its libraries were in a folder of the unit.
    EXPECT_EQ(runOnHost(orvaneUnit({"run", unit(), "--orvane", "/bin/true"})).exitStatus, 0);
    EXPECT_EQ(folderNames(unit()), before);
}

TEST_F(NothingLostTracedTest, IgnoredHangUpInterruptsNothing) {
    const kit::RunResult result = runOnHost(
        Words{"sh", "-c", "trap '' HUP; exec \"$@\"", "sh", "strace", "-qq", "-o", "/dev/null",
              "-e", "inject=ftruncate:signal=SIGHUP:when=1", "-E", "ASAN_OPTIONS=detect_leaks=0"} +
        orvaneUnit({"new", folder() / "made"}));
    EXPECT_EQ(result.exitStatus, 0);
    EXPECT_TRUE(exists(folder() / "made/.orvane-unit"));
}

TEST_F(NothingLostTracedTest, NextCallRemovesWhatAKillLeaves) {
    fs::create_directory(folder() / "empty");
    const std::set<std::string> before = folderNames(folder());
    const std::string cases = folder() / "cases";
    EXPECT_EQ(interrupted("ftruncate", "SIGKILL", {"new", folder() / "made"}).exitStatus, 137);
    EXPECT_EQ(folderNames(folder()).size(), before.size() + 1);
    EXPECT_EQ(runOnHost(orvaneUnit({"new", folder() / "other"})).exitStatus, 0);
    fs::remove_all(folder() / "other");
    EXPECT_EQ(folderNames(folder()), before);

    EXPECT_EQ(interrupted("ftruncate", "SIGKILL", {"new", folder() / "empty"}).exitStatus, 137);
    EXPECT_EQ(folderNames(folder() / "empty").size(), 1U);
    EXPECT_EQ(runOnHost(orvaneUnit({"new", folder() / "empty"})).exitStatus, 0);
    EXPECT_EQ(folderNames(folder() / "empty"),
              (std::set<std::string>{".orvane-unit", "dev", "fs", "tmp"}));

    EXPECT_EQ(interrupted("ftruncate", "SIGKILL", {"check", cases}).exitStatus, 137);
    EXPECT_EQ(folderNames(temporary()).size(), 1U);
    runOnHost(Words{"env", "TMPDIR=" + temporary().string()} + orvaneUnit({"check", cases}));
    EXPECT_EQ(folderNames(temporary()), std::set<std::string>{});
}

TEST_F(NothingLostTracedTest, KilledUpdateLeavesTheOldExpectationOrTheNew) {
    const std::string cases = folder() / "cases";
    const fs::path one = folder() / "cases/one";
    const fs::path expected = one / "expected";
    const auto list = [&] { return readFile(expected / "tmp.list"); };
    ASSERT_EQ(runOnHost(orvaneUnit({"check", cases, "--update"})).exitStatus, 0);
    const std::string made = list();
    int kept = 0;
    int replaced = 0;
    for (const std::string call : {"?link,?linkat", "renameat2", "unlinkat"}) {
        for (int number = 1; number <= 3; ++number) {
            SCOPED_TRACE(call + " " + std::to_string(number));
            fs::remove_all(expected);
            fs::create_directories(expected / "tmp");
            writeFile(expected / "tmp.list", "older\n");
            writeFile(expected / "tmp/older", "text");
            writeFile(expected / "notes", "of a person");
            const kit::RunResult result =
                injected(call + ":signal=SIGKILL:when=" + std::to_string(number),
                         {"check", cases, "--update"});
            EXPECT_TRUE(result.exitStatus == 0 || result.exitStatus == 128 + SIGKILL);
            const bool isOld = list() == "older\n";
            (isOld ? kept : replaced) += 1;
            EXPECT_TRUE(isOld || list() == made) << list();
            EXPECT_EQ(exists(expected / "tmp/older"), isOld);
            EXPECT_EQ(exists(expected / "tmp/airplay.conf"), !isOld);
            EXPECT_EQ(readFile(expected / "notes"), "of a person");
            runOnHost(Words{"env", "TMPDIR=" + temporary().string()} +
                      orvaneUnit({"check", cases, "--update"}));
            EXPECT_EQ(list(), made);
            EXPECT_EQ(folderNames(one), (std::set<std::string>{"expected", "unit.toml"}));
        }
    }
    EXPECT_GT(kept, 0);
    EXPECT_GT(replaced, 0);
    EXPECT_EQ(folderNames(temporary()), std::set<std::string>{});
}

TEST_F(NothingLostTest, CheckGoesOnAfterABadCaseAndThenFails) {
    fs::create_directory(folder() / "cases/bad");
    const std::string description = folder() / "cases/bad/unit.toml";
    writeFile(description, "folders = 1\n");
    const kit::RunResult result = runOnHost(orvaneUnit({"check", folder() / "cases", "--update"}));
    EXPECT_EQ(result.exitStatus, 2);
    EXPECT_EQ(result.standardOutput.find("bad  not updated\none  updated\n"
                                         "2 units, 1 updated, 0 unchanged, 1 not updated\n"),
              0U)
        << result.standardOutput;
    EXPECT_EQ(result.standardError.find("orvane-unit: " + description + ":1:"), 0U)
        << result.standardError;
}

TEST_F(NothingLostTracedTest, InterruptedSetIsDoneWholly) {
    EXPECT_EQ(
        interrupted("pwrite64", "SIGTERM", {"set", unit(), "param.22=0", "serial=NEW"}).exitStatus,
        128 + SIGTERM);
    EXPECT_NE(explained().find("rightHandDrive = 0"), std::string::npos);
    EXPECT_NE(explained().find("serial=NEW "), std::string::npos);
}

TEST_F(NothingLostTracedTest, FailedWriteNamesItsAssignmentAndWhatHasBeenSet) {
    const auto failAt = [&](const std::string& which) {
        return injected("pwrite64:error=EIO:when=" + which,
                        {"set", unit(), "param.22=0", "serial=NEW", "param.139=12"});
    };
    kit::RunResult result = failAt("1");
    EXPECT_EQ(result.exitStatus, 2);
    EXPECT_EQ(result.standardError, std::string("orvane-unit: param.22=0: cannot write ") +
                                        IMAGE_PATH +
                                        ": Input/output error; nothing has been set\n");
    result = failAt("3");
    EXPECT_EQ(result.exitStatus, 2);
    EXPECT_EQ(result.standardError,
              std::string("orvane-unit: param.139=12: cannot write ") + IMAGE_PATH +
                  ": Input/output error; only this has been set: param.22=0, serial=NEW\n");
    EXPECT_NE(explained().find("rightHandDrive = 0"), std::string::npos);
    EXPECT_NE(explained().find("serial=NEW "), std::string::npos);
    EXPECT_NE(explained().find("Quarion Velmira"), std::string::npos);
}

/// A small file system of its own.
class FullDiskTest : public NothingLostTest {
protected:
    fs::path mounted() const { return folder() / "mounted"; }
    std::string complaint() const { return readFile(folder() / "complaint"); }

    /// Runs `script` where the file system is "$0", its folder above can be written, and "$@" is
    /// orvane-unit. Nothing where no file system can be mounted.
    std::optional<kit::RunResult> runThere(const std::string& script) const {
        fs::create_directory(mounted());
        const std::string mount = "mount -t tmpfs -o size=64k tmpfs \"$0\" || exit 77\n";
        Words command = {"unshare", "--mount"};
        if (geteuid() != 0) {
            command.push_back("--map-root-user");
        }
        const kit::RunResult result =
            runOnHost(command + Words{"sh", "-c", mount + script, mounted()} + orvaneUnit({}));
        const bool isMounted = result.exitStatus != 77 && result.standardError.find("unshare") != 0;
        return isMounted ? std::optional(result) : std::nullopt;
    }
};

TEST_F(FullDiskTest, NewNamesTheFileAndTheReason) {
    writeFile(folder() / "slot.toml", "[disk.slots]\n9 = \"SN\"\n");
    writeFile(folder() / "both.toml",
              "[disk.slots]\n9 = \"SN\"\n[disk.tuning.0]\nqwaSendGain = 1\n");
    const std::optional<kit::RunResult> result = runThere(R"(
for pages in 0 1; do
    dd if=/dev/zero of="$0/rest" bs=4096 2>/dev/null
    truncate --size=-$((pages * 4096)) "$0/rest"
    case $pages in 0) name=slot ;; 1) name=both ;; esac
    "$@" new "$0/unit" --from "$0/../$name.toml" 2>>"$0/../complaint"
    echo $? $(ls -A "$0")
done
)");
    if (!result) {
        GTEST_SKIP() << "no file system can be mounted";
    }
    EXPECT_EQ(result->standardOutput, "2 rest\n2 rest\n") << result->standardError;
    const std::string line = "orvane-unit: cannot write " + (mounted() / "unit/dev/hd0").string() +
                             ": No space left on device\n";
    EXPECT_EQ(complaint(), line + line);
}

/// The unit's disk is a hole.
TEST_F(FullDiskTest, SetChangesNothing) {
    writeFile(folder() / "unit.toml", "[image.params]\n22 = 1\n");
    const std::optional<kit::RunResult> done = runThere(R"(
"$@" new "$0/unit" --from "$0/../unit.toml" || exit 78
dd if=/dev/zero of="$0/rest" bs=4096 2>/dev/null
"$@" set "$0/unit" param.22=0 serial=NEW 2>"$0/../complaint"
echo $?
"$@" show "$0/unit" --only params | grep '^ *22 '
)");
    if (!done) {
        GTEST_SKIP() << "no file system can be mounted";
    }
    const kit::RunResult& result = *done;
    EXPECT_EQ(result.standardOutput.substr(0, 2), "2\n") << result.standardError;
    EXPECT_NE(result.standardOutput.find(" 0x01 "), std::string::npos) << result.standardOutput;
    EXPECT_EQ(complaint(),
              "orvane-unit: serial=NEW: cannot write /dev/hd0: No space left on device\n");
}

TEST_F(NothingLostTest, LimitForFilesIsAnErrorLikeAFullDisk) {
    const std::set<std::string> before = folderNames(folder());
    {
        const ResourceLimit limit(RLIMIT_FSIZE, 4096); // also of what the program prints
        const std::string refused = ": File too large\n";
        const kit::RunResult made = runOnHost(orvaneUnit({"new", folder() / "made"}));
        EXPECT_EQ(made.exitStatus, 2);
        EXPECT_NE(made.standardError.find(refused), std::string::npos) << made.standardError;
        const kit::RunResult set =
            runOnHost(orvaneUnit({"set", unit(), "param.22=0", "serial=NEW"}));
        EXPECT_EQ(set.exitStatus, 2);
        EXPECT_EQ(set.standardError, "orvane-unit: serial=NEW: cannot write /dev/hd0" + refused);
    }
    EXPECT_EQ(folderNames(folder()), before);
    EXPECT_NE(explained().find("rightHandDrive = 1"), std::string::npos);
}

TEST_F(NothingLostTest, UnitThatIsBeingChangedIsLeftAlone) {
    const std::string before = explained();
    const kit::FolderLock lock(unit());
    for (const Words& words :
         {Words{"set", unit(), "param.22=0"}, Words{"run", unit(), "--", "-a"}}) {
        const kit::RunResult result = runOnHost(orvaneUnit(words));
        EXPECT_EQ(result.exitStatus, 2);
        EXPECT_EQ(result.standardOutput, "");
        const std::string begin = "orvane-unit: ";
        ASSERT_EQ(result.standardError.compare(0, begin.size(), begin), 0);
        expectHolderNamed(result.standardError.substr(
                              begin.size(), result.standardError.find('\n') - begin.size()),
                          unit());
    }
    EXPECT_EQ(explained(), before);
    EXPECT_TRUE(fs::is_empty(unit() + "/tmp"));
}

/// Each caller waits for the other, and tries again if that takes longer than it waits.
TEST_F(NothingLostTest, ChangesAtOnceAreAllKept) {
    const std::string script = R"(
again() {
    until "$@" 2>"$complaint"; do
        grep -q 'is being changed by' "$complaint" || exit 1
    done
}
(complaint=$0.1; again "$@" tuning.3.qwaAECSwitch=qwaOn) &
first=$!
(complaint=$0.2; again "$@" tuning.3.qwaAGCSwitch=qwaOn) &
wait $! && wait $first
)";
    const kit::RunResult result =
        runOnHost(Words{"sh", "-c", script, folder() / "complaint"} + orvaneUnit({"set", unit()}));
    EXPECT_EQ(result.exitStatus, 0) << result.standardError;
    const std::string shown =
        runOnHost(orvaneUnit({"show", unit(), "--only", "tuning"})).standardOutput;
    EXPECT_TRUE(std::regex_search(shown, std::regex("qwaAECSwitch +2 +qwaOn"))) << shown;
    EXPECT_TRUE(std::regex_search(shown, std::regex("qwaAGCSwitch +2 +qwaOn"))) << shown;
}

TEST_F(NothingLostTest, NewAndCaptureFillTheWorkingDirectoryOfTheirCaller) {
    const std::string empty = folder() / "empty";
    for (const Words& words : {Words{"new", "."}, Words{"new", empty + "/."},
                               Words{"capture", unit(), "."}, Words{"capture", unit(), empty}}) {
        SCOPED_TRACE(words[0] + " " + words.back());
        fs::create_directory(empty);
        // ls looks into the folder in which it has been started, not into one of the same name.
        const kit::RunResult result =
            runOnHost(Words{"sh", "-c", "cd \"$0\" && \"$@\" && ls -A", empty} + orvaneUnit(words));
        EXPECT_EQ(result.exitStatus, 0) << result.standardError;
        EXPECT_EQ(result.standardOutput, ".orvane-unit\ndev\nfs\ntmp\n");
        fs::remove_all(empty);
    }
}

} // namespace

} // namespace orvane::test
