// SPDX-License-Identifier: Apache-2.0
//
// A report is written whole, or the exit status and a line on standard error say that it is not.
#include "kit/enter/captured_run.h"
#include "tests/kit/unit/described_unit.h"
#include "tests/orvane_unit/orvane_unit_command.h"
#include "tests/support/unit_test.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <string>
#include <vector>

namespace orvane::test {

namespace {

/// Runs the program through a shell with `redirections`.
kit::RunResult startWith(const std::string& redirections, const Words& words) {
    return runOnHost(Words{"sh", "-c", "\"$@\" " + redirections, "sh"} + orvaneUnit(words));
}

/// Every command that prints something, and help.
std::vector<Words> printingCommands(const DescribedUnit& described) {
    const std::string root = described.root();
    const std::string cases = described.folder() / "cases";
    std::filesystem::create_directories(cases + "/one");
    writeFile(cases + "/one/unit.toml", "");
    return {{"describe", root},
            {"show", root},
            {"show", root, "--json"},
            {"explain", root},
            {"explain", root, "--json"},
            {"run", root, "--json"},
            {"diff", root, root, "--json"},
            {"impact", root, "param.22"},
            {"impact", root, "param.22", "--json"},
            {"check", cases},
            {"check", cases, "--json"},
            {"check", cases, "--update"},
            {"--help"},
            {"new", "--help"},
            {"--version"}};
}

TEST(StandardOutputTest, ReportThatCannotBeWrittenIsAnError) {
    struct Row {
        const char* redirection;
        const char* reason;
    };
    const Row rows[] = {{">/dev/full", "No space left on device"},
                        {">&-", "Bad file descriptor"},
                        {"</dev/null >&0", "Bad file descriptor"}};
    const DescribedUnit described;
    for (const Words& words : printingCommands(described)) {
        for (const Row& row : rows) {
            const kit::RunResult result = startWith(row.redirection, words);
            EXPECT_EQ(result.exitStatus, 2) << words[0] << ' ' << row.redirection;
            EXPECT_EQ(result.standardError, std::string("orvane-unit: cannot write to standard "
                                                        "output: ") +
                                                row.reason + "\n")
                << words[0] << ' ' << row.redirection;
        }
    }
}

/// No line can say it there.
TEST(StandardOutputTest, MessageOfTheToolThatIsLostIsAnError) {
    const DescribedUnit described;
    const Words words = {"run", described.root(), "--orvane", ORVANE_BINARY, "--", "-q"};
    EXPECT_EQ(startWith("2>/dev/null", words).exitStatus, 0);
    EXPECT_EQ(startWith("2>/dev/full", words).exitStatus, 2);
    EXPECT_EQ(startWith("2>&-", words).exitStatus, 2);
}

/// The reader of the pipe has ended before the program starts.
TEST(StandardOutputTest, PipeWithoutAReaderIsAnError) {
    const DescribedUnit described;
    const std::string pipe = described.folder() / "pipe";
    const std::string ended = "mkfifo \"$0\"; exec 3<>\"$0\" 4>\"$0\" 3>&-; shift 0; \"$@\" >&4";
    Words command = {"sh", "-c", ended, pipe};
    const Words program = buildCommand(ORVANE_UNIT_BINARY);
    command.insert(command.end(), program.begin(), program.end());
    command.insert(command.end(), {"describe", described.root()});
    const kit::RunResult result = runOnHost(command);
    EXPECT_EQ(result.exitStatus, 2);
    EXPECT_EQ(result.standardError, "orvane-unit: cannot write to standard output: Broken pipe\n");
}

TEST(StandardOutputTest, CommandThatPrintsNothingNeedsNoOutput) {
    const DescribedUnit described;
    const std::string root = described.root();
    const std::string other = described.folder() / "other";
    for (const std::string redirections : {">/dev/full", ">&-", "<&-", "2>&-", "<&- >&- 2>&-"}) {
        EXPECT_EQ(startWith(redirections, {"new", other}).exitStatus, 0) << redirections;
        EXPECT_EQ(startWith(redirections, {"set", other, "param.22=1"}).exitStatus, 0);
        EXPECT_EQ(startWith(redirections, {"run", other, "--brief"}).exitStatus, 0);
        EXPECT_EQ(startWith(redirections, {"capture", root, other + "2"}).exitStatus, 0);
        EXPECT_EQ(startWith("", {"diff", root, other + "2"}).exitStatus, 0) << redirections;
        std::filesystem::remove_all(other);
        std::filesystem::remove_all(other + "2");
    }
}

TEST(StandardOutputTest, ClosedStreamsAreNotTakenByFiles) {
    const DescribedUnit described;
    const Words words = {"run", described.root(),          "--json", "--orvane", "/bin/sh", "--",
                         "-c",  "echo out; echo error >&2"};
    const kit::RunResult expected = startWith("", words);
    EXPECT_NE(expected.standardOutput.find(R"("standardOutput":"out\n","standardError":"error\n")"),
              std::string::npos)
        << expected.standardOutput << expected.standardError;
    for (const std::string redirections : {"<&-", "2>&-", "<&- 2>&-"}) {
        const kit::RunResult result = startWith(redirections, words);
        EXPECT_EQ(result.exitStatus, 0) << redirections;
        EXPECT_EQ(result.standardOutput, expected.standardOutput) << redirections;
    }
}

} // namespace

} // namespace orvane::test
