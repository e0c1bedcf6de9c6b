// SPDX-License-Identifier: Apache-2.0
//
// Wrong use and bad input: exit status 2, a complaint on standard error, nothing on standard
// output.
#include "kit/description/unit_layout.h"
#include "kit/enter/captured_run.h"
#include "kit/unit/marker.h"
#include "orvane_unit/command_line.h"
#include "tests/kit/unit/described_unit.h"
#include "tests/orvane_unit/orvane_unit_command.h"
#include "tests/support/failing_memory.h"
#include "tests/support/host_command.h"
#include "tests/support/standard_streams.h"
#include "tests/support/temporary_folder.h"
#include "tests/support/unit_test.h"

namespace orvane::test {

namespace {

namespace fs = std::filesystem;

constexpr char PROGRAM[] = "orvane-unit: ";

/// The program's complaint; requires exit status 2 and no other output.
std::string refusalOf(const Words& words) {
    const kit::RunResult result = runOrvaneUnit(words);
    EXPECT_EQ(result.exitStatus, 2);
    EXPECT_EQ(result.standardOutput, "");
    EXPECT_EQ(result.standardError.compare(0, sizeof PROGRAM - 1, PROGRAM), 0)
        << result.standardError;
    EXPECT_EQ(result.standardError.empty() ? ' ' : result.standardError.back(), '\n');
    return result.standardError;
}

/// The root is below /proc, where nobody can make a folder, so it exists on no host.
class MissingRootTest : public ::testing::TestWithParam<Words> {};

TEST_P(MissingRootTest, IsBadInput) {
    EXPECT_NE(refusalOf(GetParam()).find("/proc/none"), std::string::npos);
}

INSTANTIATE_TEST_SUITE_P(
    Commands, MissingRootTest,
    ::testing::Values(
        Words{"describe", "/proc/none/unit"}, Words{"set", "/proc/none/unit", "param.1=1"},
        Words{"show", "/proc/none/unit"}, Words{"show", "/proc/none/unit", "--json"},
        Words{"explain", "/proc/none/unit"}, Words{"explain", "/proc/none/unit", "--json"},
        Words{"run", "/proc/none/unit"}, Words{"diff", "/proc/none/unit", "/proc/none/unit"},
        Words{"impact", "/proc/none/unit"}, Words{"capture", "/proc/none/unit", "/proc/none/new"},
        Words{"report", "/proc/none/unit", "-o", "/proc/none/page.html"},
        Words{"check", "/proc/none/cases"}, Words{"new", "/proc/none/at/all"},
        Words{"new", "/proc/none/unit", "--from", "/proc/none/unit.toml"}),
    [](const ::testing::TestParamInfo<Words>& words) {
        return words.param[0] + "_" + std::to_string(words.index);
    });

TEST(RefusalTest, UnknownWordsAndOptionsAreNamed) {
    const DescribedUnit described;
    const std::string root = described.root();
    EXPECT_NE(refusalOf({"show", root, "--only", "engine"})
                  .find("engine not in {params,records,tuning,versions,files}"),
              std::string::npos);
    EXPECT_NE(refusalOf({"explain", root, "-b"}).find("-b"), std::string::npos);
    EXPECT_NE(refusalOf({"explain", root, "-ab"}).find("-b"), std::string::npos);
    EXPECT_NE(refusalOf({"impact", root, "engine."}).find("engine."), std::string::npos);
    EXPECT_NE(refusalOf({"show", root, "--wrong"}).find("--wrong"), std::string::npos);
}

TEST(RefusalTest, EmptyValueOfAnOptionIsNotItsDefault) {
    const DescribedUnit described;
    const std::string root = described.root();
    for (const Words& words :
         {Words{"new", described.folder() / "new", "--from", ""},
          Words{"run", root, "--orvane", ""}, Words{"check", described.folder(), "--orvane", ""},
          Words{"impact", root, ""}}) {
        EXPECT_NE(refusalOf(words).find("the value is empty"), std::string::npos) << words[0];
    }
    EXPECT_FALSE(fs::exists(described.folder() / "new"));
}

TEST(RefusalTest, EmptyValueAfterAnEqualsSignIsNotTheNextWord) {
    const DescribedUnit described;
    const std::string root = described.root();
    const std::string empty = "the value is empty\n";
    EXPECT_EQ(refusalOf({"run", root, "--orvane="}), "orvane-unit: --orvane: " + empty);
    EXPECT_EQ(refusalOf({"run", "--orvane=", root}), "orvane-unit: --orvane: " + empty);
    EXPECT_EQ(refusalOf({"run", root, "--orvane=", "--", "-a"}), "orvane-unit: --orvane: " + empty);
    EXPECT_EQ(refusalOf({"check", root, "--orvane="}), "orvane-unit: --orvane: " + empty);
    EXPECT_EQ(refusalOf({"new", described.folder() / "new", "--from="}),
              "orvane-unit: --from: " + empty);
    EXPECT_EQ(refusalOf({"show", root, "--only="}), refusalOf({"show", root, "--only", ""}));
    EXPECT_EQ(refusalOf({"show", root, "--orvane="}),
              "orvane-unit: show does not take \"--orvane=\"\n");
    EXPECT_FALSE(fs::exists(described.folder() / "new"));
}

TEST(RefusalTest, WordsBehindTheHyphensAreOrvanesOwn) {
    const DescribedUnit described;
    const kit::RunResult result =
        runOrvaneUnit({"run", described.root(), "--orvane", "/bin/sh", "--", "-c",
                       "echo \"$0\" \"$1\"", "--orvane=", "next"});
    EXPECT_EQ(result.standardOutput.substr(0, 15), "--orvane= next\n") << result.standardError;
}

TEST(RefusalTest, RootThatIsAFileIsBadInput) {
    const TemporaryFolder folder;
    const std::string file = folder.path() / "file";
    writeFile(file, "text");
    for (const Words& words : {Words{"show", file}, Words{"explain", file}, Words{"run", file},
                               Words{"new", file}, Words{"check", file}}) {
        EXPECT_NE(refusalOf(words).find(file), std::string::npos);
    }
    EXPECT_EQ(readFile(file), "text");
}

TEST(RefusalTest, ComplaintsEscapeAnythingThatIsNotText) {
    EXPECT_NE(refusalOf({"show", "/proc/none/\x1b[2J\xff"}).find("/proc/none/\\x1b[2J\\xff"),
              std::string::npos);
}

/// What is wrong, and with what.
TEST(RefusalTest, ComplaintsNameThePathAndTheSystemsReason) {
    const std::string missing = "/proc/none/x: No such file or directory\n";
    for (const Words& words :
         {Words{"new", "/proc/none/unit", "--from", "/proc/none/x"}, Words{"check", "/proc/none/x"},
          Words{"explain", "/proc/none/x"}, Words{"run", "/proc/none/x"}}) {
        EXPECT_EQ(refusalOf(words), "orvane-unit: cannot read " + missing) << words[0];
    }
    EXPECT_EQ(refusalOf({"new", ""}), "orvane-unit: cannot make \"\": No such file or directory\n");
    EXPECT_EQ(refusalOf({"show", ""}),
              "orvane-unit: cannot read \"\": No such file or directory\n");
}

TEST(RefusalTest, FolderForTemporaryFilesIsNamed) {
    const DescribedUnit described;
    const auto refusalWith = [&described](const std::string& folder) {
        Words command = buildCommand(ORVANE_UNIT_BINARY);
        command.insert(command.begin(), {"env", "TMPDIR=" + folder});
        command.insert(command.end(), {"impact", described.root(), "param.22"});
        const kit::RunResult result = runOnHost(command);
        EXPECT_EQ(result.exitStatus, 2);
        return result.standardError;
    };
    const std::string begin = "orvane-unit: no folder for temporary files (TMPDIR): ";
    EXPECT_EQ(refusalWith("/proc/none"),
              begin + "cannot read /proc/none: No such file or directory\n");
    const std::string file = described.root() / kit::MARKER_NAME;
    EXPECT_EQ(refusalWith(file), begin + file + " is not a folder\n");
}

TEST(RefusalTest, ComplaintIsOneLineWhateverItNames) {
    const DescribedUnit described;
    EXPECT_EQ(refusalOf({"show", "/proc/a\nb"}),
              "orvane-unit: cannot read /proc/a\\nb: No such file or directory\n");
    EXPECT_EQ(refusalOf({"set", described.root(), "param.1=1\n2"}),
              "orvane-unit: param.1=1\\n2: parameter 1 takes a whole number, not \"1\\n2\"\n");
    EXPECT_EQ(refusalOf({"show", "a", "b\nc"}), "orvane-unit: show does not take \"b\\nc\"\n");
}

TEST(RefusalTest, ZeroByteDoesNotCutAComplaint) {
    const TemporaryFolder folder;
    const std::string description = folder.path() / "unit.toml";
    writeFile(description, "[files]\n\"/a\\u0000b\" = \"\"\n");
    EXPECT_EQ(
        refusalOf({"new", folder.path() / "unit", "--from", description}),
        "orvane-unit: " + description +
            ":2:1: a path must be absolute and have no \".\", \"..\" or needless \"/\", and no "
            "zero byte, unlike \"/a\\x00b\"\n");
}

/// Allocations fail one after the other, and from each on.
TEST(RefusalTest, ShortageOfMemoryIsNamed) {
    const char* const words[] = {"orvane-unit", "show"};
    for (const Shortage shortage : {Shortage::once, Shortage::forGood}) {
        for (int first = 1; first <= 500; first += 7) {
            StandardStreams streams;
            int status = 0;
            {
                const FailingMemory memory(first, shortage);
                status = desk::runCommandLine(2, words);
            }
            EXPECT_EQ(streams.stop(), "orvane-unit: out of memory\n") << first;
            EXPECT_EQ(status, 2);
        }
    }
}

TEST(RefusalTest, OtherContentIsNotAMark) {
    const DescribedUnit described;
    writeFile(described.root() / kit::MARKER_NAME, "made by someone else\n");
    refusalOf({"run", described.root(), "--", "-a"});
    refusalOf({"set", described.root(), "param.22=0"});
    EXPECT_TRUE(fs::is_empty(described.root() / "tmp"));
}

TEST(RefusalTest, BinaryThatIsNotAProgramIsBadInput) {
    const DescribedUnit described;
    const std::string binary = described.folder() / "orvane";
    writeFile(binary, "#!/bin/sh\n");
    EXPECT_NE(refusalOf({"run", described.root(), "--orvane", binary}).find(binary),
              std::string::npos);
    EXPECT_TRUE(fs::is_empty(described.root() / "tmp"));
}

TEST(RefusalTest, InputsWithoutALimitAreNotReadToTheirEnd) {
    const DescribedUnit described([](kit::UnitDescription& unit) {
        unit.sparseFiles["/fs/rwdata/.Version/long.inf"].size = std::uint64_t{1} << 40U;
    });
    const std::string root = described.root();
    for (const Words& words :
         {Words{"new", described.folder() / "new", "--from", "/dev/zero"}, Words{"explain", root},
          Words{"show", root}, Words{"diff", root, root}, Words{"impact", root, "param.22"}}) {
        const std::string complaint = refusalOf(words);
        EXPECT_NE(complaint.find(" has more than "), std::string::npos) << complaint;
    }
    fs::remove(root + "/fs/rwdata/.Version/long.inf");
    fs::resize_file(root + "/fs/mp/etc/airplay_static.conf", std::uint64_t{1} << 40U);
    EXPECT_NE(
        refusalOf({"explain", root}).find("airplay_static.conf has more than 268435456 bytes"),
        std::string::npos);
    writeFile(root + "/tmp/other", "");
    fs::resize_file(root + "/tmp/other", std::uint64_t{1} << 40U);
    EXPECT_NE(refusalOf({"run", root, "--orvane", ORVANE_BINARY})
                  .find("/tmp/other has more than 268435456 bytes"),
              std::string::npos);
}

TEST(RefusalTest, ArgumentsWithoutALimitAreNotReadToTheirEnd) {
    const TemporaryFolder cases;
    fs::create_directory(cases.path() / "one");
    writeFile(cases.path() / "one/unit.toml", "");
    const fs::path arguments = cases.path() / "one/arguments";
    const auto complaint = [&cases] {
        const kit::RunResult result =
            runOrvaneUnit({"check", cases.path(), "--orvane", ORVANE_BINARY});
        EXPECT_EQ(result.exitStatus, 2);
        return result.standardError;
    };
    fs::create_symlink("/dev/zero", arguments);
    EXPECT_EQ(complaint(), "orvane-unit: " + arguments.string() + " is not a regular file\n");
    fs::remove(arguments);
    writeFile(arguments, "");
    fs::resize_file(arguments, 268435457);
    EXPECT_EQ(complaint(), "orvane-unit: " + arguments.string() +
                               " has more than 268435456 bytes, the most allowed\n");
}

} // namespace

} // namespace orvane::test
