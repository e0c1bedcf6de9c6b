// SPDX-License-Identifier: Apache-2.0
#include "kit/enter/run_inside.h"
#include "kit/host/kit_error.h"
#include "tests/kit/host/open_descriptors.h"
#include "tests/support/permissions.h"
#include "tests/support/temporary_folder.h"
#include "tests/support/unit_test.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <set>
#include <string>
#include <vector>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;

constexpr char STOCK_FILE[] = "stock, no line end";

/// A unit with only what `orvane -a` needs to leave a stock file, and without any program.
class RunInsideTest : public ::testing::Test {
protected:
    RunInsideTest() {
        fs::create_directories(root() / "fs/mp/etc");
        fs::create_directory(root() / "tmp");
        writeFile(root() / "fs/mp/etc/airplay.conf", STOCK_FILE);
    }
    ~RunInsideTest() override { fs::current_path(hostCwd_); }

    const fs::path& root() const { return folder_.path(); }

    kit::RunResult runTool(const std::vector<std::string>& arguments) const {
        return kit::runInside(root(), {ORVANE_BINARY, arguments});
    }

    /// A dynamic program of the host that can end in any way.
    kit::RunResult runShell(const std::string& script) const {
        return kit::runInside(root(), {"/bin/sh", {"-c", script}});
    }

    std::string refusalOf(const fs::path& binary) const {
        try {
            kit::runInside(root(), {binary, {}});
        } catch (const kit::KitError& error) {
            return error.what();
        }
        return "";
    }

    const fs::path& hostCwd() const { return hostCwd_; }

private:
    TemporaryFolder folder_;
    fs::path hostCwd_ = fs::current_path();
};

TEST_F(RunInsideTest, ToolOfThisBuildHasTheUnitAsItsRoot) {
    const kit::RunResult result = runTool({"-a"});
    EXPECT_EQ(result.exitStatus, 0);
    EXPECT_EQ(result.standardOutput, "");
    EXPECT_EQ(result.standardError, "");
    EXPECT_EQ(readFile(root() / "tmp/airplay.conf"), STOCK_FILE);
}

TEST_F(RunInsideTest, OnlyTheToolsFilesAreLeftInTheUnit) {
    runTool({"-a"});
    EXPECT_EQ(folderNames(root()), (std::set<std::string>{"fs", "tmp"}));
    EXPECT_EQ(folderNames(root() / "tmp"), (std::set<std::string>{"airplay.conf"}));
}

TEST_F(RunInsideTest, UnknownLetterIsReportedOnStandardErrorUnderTheToolsName) {
    const kit::RunResult result = runTool({"-x"});
    EXPECT_EQ(result.exitStatus, 0);
    EXPECT_EQ(result.standardOutput, "");
    EXPECT_EQ(result.standardError, "orvane: invalid option -- 'x'\n");
    EXPECT_TRUE(fs::is_empty(root() / "tmp"));
}

TEST_F(RunInsideTest, StatusOfAnotherProgramOfThisBuildIsPassedOn) {
    const kit::RunResult result = kit::runInside(root(), {ORVANE_UNIT_BINARY, {"run", "/none"}});
    EXPECT_EQ(result.exitStatus, 2);
    EXPECT_EQ(result.standardOutput, "");
    EXPECT_EQ(result.standardError, "orvane-unit: cannot read /none: No such file or directory\n");
}

TEST_F(RunInsideTest, BinaryMayBeNamedRelativeToTheHostsWorkingDirectory) {
    fs::current_path(root().parent_path());
    const kit::RunResult result =
        kit::runInside(root().filename(), {fs::relative(ORVANE_BINARY), {"-a"}});
    EXPECT_EQ(result.exitStatus, 0);
    EXPECT_EQ(readFile(root() / "tmp/airplay.conf"), STOCK_FILE);
}

TEST_F(RunInsideTest, StatusOfADynamicProgramIsPassedOn) {
    EXPECT_EQ(runShell("exit 7").exitStatus, 7);
}

TEST_F(RunInsideTest, StatusOfASignalIsItsNumberAbove128) {
    EXPECT_EQ(runShell("kill -TERM $$").exitStatus, 128 + 15);
}

TEST_F(RunInsideTest, DynamicProgramHasTheUnitAsItsRoot) {
    const kit::RunResult result = runShell("for name in /fs/mp/etc/*; do echo $name; done");
    EXPECT_EQ(result.standardOutput, "/fs/mp/etc/airplay.conf\n");
    EXPECT_EQ(folderNames(root()), (std::set<std::string>{"fs", "tmp"}));
}

TEST_F(RunInsideTest, ProcOfTheUnitIsKept) {
    fs::create_directory(root() / "proc");
    writeFile(root() / "proc/mine", "kept");
    EXPECT_EQ(runShell("exit 0").exitStatus, 0);
    EXPECT_EQ(readFile(root() / "proc/mine"), "kept");
}

TEST_F(RunInsideTest, StandardInputIsEmpty) {
    EXPECT_EQ(runShell("read line; echo $?").standardOutput, "1\n");
}

TEST_F(RunInsideTest, BothOutputsAreKeptWholeAndApart) {
    const kit::RunResult result =
        runShell("i=0; while [ $i -lt 3000 ]; do i=$((i+1)); echo out,$i,,,,,,,,,,,,,,,,,,,,,,; "
                 "echo error,$i,,,,,,,,,,,,,,,,,,,,,, >&2; done");
    std::string output;
    std::string error;
    for (int i = 1; i <= 3000; ++i) {
        output += "out," + std::to_string(i) + std::string(22, ',') + '\n';
        error += "error," + std::to_string(i) + std::string(22, ',') + '\n';
    }
    EXPECT_GT(output.size(), 65536U); // more than a pipe holds
    EXPECT_TRUE(result.standardOutput == output) << result.standardOutput.size() << " bytes";
    EXPECT_TRUE(result.standardError == error) << result.standardError.size() << " bytes";
}

TEST_F(RunInsideTest, MissingBinaryIsNamed) {
    const std::string missing = (root() / "no-program").string();
    EXPECT_EQ(refusalOf(missing), "cannot read " + missing + ": No such file or directory");
}

TEST_F(RunInsideTest, PathInsideTheUnitIsNotABinary) {
    // The host can't have this path: it contains the test's own folder.
    const fs::path path = root() / "orvane";
    const fs::path inUnit = root() / path.relative_path();
    fs::create_directories(inUnit.parent_path());
    fs::copy_file(ORVANE_BINARY, inUnit);
    EXPECT_EQ(refusalOf(path), "cannot read " + path.string() + ": No such file or directory");
}

TEST_F(RunInsideTest, FileThatIsNotAProgramIsNamed) {
    const std::string tool = readFile(ORVANE_BINARY);
    const std::string otherByteOrder = tool.substr(0, 5) + '\2' + tool.substr(6, 500);
    const std::string otherClass = tool.substr(0, 4) + '\3' + tool.substr(5, 500);
    for (const std::string& content : {std::string(), std::string("#!/bin/sh\n"),
                                       tool.substr(0, 15), otherByteOrder, otherClass}) {
        const std::string file = (root() / "file").string();
        writeFile(file, content);
        EXPECT_EQ(refusalOf(file), file + " is not a little-endian ELF program");
    }
    const std::string folder = (root() / "tmp").string();
    EXPECT_EQ(refusalOf(folder), folder + " is a folder, not a program");
}

TEST_F(RunInsideTest, TruncatedProgramIsNamed) {
    const std::string tool = readFile(ORVANE_BINARY);
    const std::string file = (root() / "file").string();
    for (const std::size_t length : {16U, 40U, 80U}) { // in the file header, in the first segment's
        writeFile(file, tool.substr(0, length));
        EXPECT_EQ(refusalOf(file), file + " is cut short") << length;
    }
}

TEST_F(RunInsideTest, RootThatIsNotAFolderIsNamed) {
    const std::string bad = (root() / "fs/mp/etc/airplay.conf").string();
    try {
        kit::runInside(bad, {ORVANE_BINARY, {}});
        ADD_FAILURE() << "ran in " << bad;
    } catch (const kit::KitError& error) {
        EXPECT_EQ(error.text(), bad + " is not a folder");
    }
}

TEST_F(RunInsideTest, UnitInWhichADynamicProgramCannotHaveItsFilesIsNamed) {
    fs::permissions(root(), fs::perms::owner_read | fs::perms::owner_exec);
    {
        const EnforcedPermissions permissions;
        EXPECT_EQ(refusalOf("/bin/sh"),
                  "a dynamic or emulated program needs a folder in the unit while it runs: cannot "
                  "make a folder in " +
                      root().string() + ": Permission denied");
    }
    fs::permissions(root(), fs::perms::owner_all);
}

TEST_F(RunInsideTest, NoRunLeavesADescriptorOrAnotherRoot) {
    const std::size_t before = openDescriptors();
    runTool({"-x"});
    runShell("exit 7");
    EXPECT_NE(refusalOf(root() / "missing"), "");
    EXPECT_NE(refusalOf(root() / "tmp"), "");
    EXPECT_EQ(openDescriptors(), before);
    EXPECT_EQ(fs::current_path(), hostCwd());
    EXPECT_TRUE(fs::exists(root())); // a path of the host
}

} // namespace

} // namespace orvane::test
