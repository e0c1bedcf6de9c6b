// SPDX-License-Identifier: Apache-2.0
#include "kit/enter/entered_root.h"
#include "kit/enter/run_inside.h"
#include "kit/host/kit_error.h"
#include "orvane_unit/check/case_check.h"
#include "tests/kit/unit/described_unit.h"
#include "tests/orvane_unit/tree_state.h"
#include "tests/support/folder_names.h"
#include "tests/support/permissions.h"
#include "tests/support/temporary_folder.h"
#include "tests/support/unit_test.h"

#include <gtest/gtest.h>
#include <sys/stat.h>

#include <algorithm>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;
using desk::CaseResult;
using desk::CheckReport;
using Lines = std::vector<std::string>;

template <class Action>
std::string refusalOf(const Action& action) {
    try {
        action();
    } catch (const kit::KitError& error) {
        return error.what();
    }
    return "";
}

/// A folder with one case that has one output, a stock file.
class CaseCheckTest : public ::testing::Test {
protected:
    CaseCheckTest() {
        fs::create_directories(expected() / "tmp");
        writeFile(folder() / "one/unit.toml",
                  "[files]\n\"/fs/mp/etc/airplay.conf\" = \"stock\\n\"\n");
        writeFile(folder() / "one/arguments", "-a\n");
        writeFile(expected() / "tmp.list", "airplay.conf\n");
        writeFile(expected() / "tmp/airplay.conf", "stock\n");
    }

    const fs::path& folder() const { return folder_.path(); }
    fs::path expected() const { return folder() / "one/expected"; }

    CheckReport check(bool updates = false) const {
        return desk::checkCases(folder(), ORVANE_BINARY, updates);
    }
    Lines differences() const { return check().cases.at(0).differences; }
    CaseResult updated(const fs::path& binary = ORVANE_BINARY) const {
        return desk::checkCases(folder(), binary, true).cases.at(0);
    }

    /// All files below the expectation with their contents, links as their targets.
    std::map<std::string, std::string> expectation() const {
        std::map<std::string, std::string> files;
        for (const auto& entry : fs::recursive_directory_iterator(expected())) {
            const std::string path = entry.path().lexically_relative(expected()).string();
            if (entry.is_symlink()) {
                files[path] = fs::read_symlink(entry.path()).string();
            } else if (entry.is_regular_file()) {
                files[path] = readFile(entry.path());
            }
        }
        return files;
    }
    using Files = std::map<std::string, std::string>;

private:
    TemporaryFolder folder_;
};

TEST_F(CaseCheckTest, ExpectedRunHasNoDifference) {
    const CheckReport report = check();
    ASSERT_EQ(report.cases.size(), 1U);
    EXPECT_EQ(report.cases[0].name, "one");
    EXPECT_EQ(report.cases[0].differences, Lines{});
    EXPECT_EQ(report.cases[0].surprises, Lines{});
    EXPECT_EQ(report.cases[0].reasons,
              (std::set<desk::Reason>{desk::Reason::profileNotGenerated,
                                      desk::Reason::templateMissing, desk::Reason::fromStock}));
    EXPECT_EQ(report.unreached.size(), desk::REASON_COUNT - 3);
}

TEST_F(CaseCheckTest, ChangedContentIsReported) {
    writeFile(expected() / "tmp/airplay.conf", "other\n");
    EXPECT_EQ(differences(), Lines{"/tmp/airplay.conf differs"});
}

TEST_F(CaseCheckTest, LongFileMayBeDescribed) {
    fs::remove(expected() / "tmp/airplay.conf");
    const auto describe = [this](const std::string& content) {
        writeFile(expected() / "tmp.toml", "[files]\n\"/tmp/airplay.conf\" = " + content + "\n");
    };
    describe("[{ repeat = \"stock\", count = 1 }, \"\\n\"]");
    EXPECT_EQ(differences(), Lines{});
    describe("\"stock\"");
    EXPECT_EQ(differences(), Lines{"/tmp/airplay.conf differs"});
    updated();
    EXPECT_EQ(expectation(),
              (Files{{"tmp.list", "airplay.conf\n"}, {"tmp/airplay.conf", "stock\n"}}));
}

TEST_F(CaseCheckTest, MissingFileOfTheExpectationIsReported) {
    fs::remove(expected() / "tmp/airplay.conf");
    EXPECT_EQ(differences(), Lines{"/tmp/airplay.conf differs"});
}

TEST_F(CaseCheckTest, MissingAndAdditionalEntriesAreReported) {
    writeFile(expected() / "tmp.list", "other\n");
    EXPECT_EQ(differences(), (Lines{"/tmp/other is missing", "/tmp/airplay.conf is not expected"}));
}

TEST_F(CaseCheckTest, EntryIsNotMatchedAsAPrefix) {
    writeFile(expected() / "tmp.list", "airplay.conf.old\n");
    writeFile(expected() / "tmp/airplay.conf", "other\n");
    EXPECT_EQ(differences(),
              (Lines{"/tmp/airplay.conf.old is missing", "/tmp/airplay.conf is not expected"}));
}

TEST_F(CaseCheckTest, MissingListIsNotAnExpectation) {
    fs::remove(expected() / "tmp.list");
    EXPECT_EQ(differences(), Lines{"expected/tmp.list is missing"});
}

TEST_F(CaseCheckTest, StandardErrorIsCompared) {
    writeFile(expected() / "stderr", "complaint\n");
    EXPECT_EQ(differences(), Lines{"standard error differs"});
}

TEST_F(CaseCheckTest, MissingTmpIsAnExpectationToo) {
    writeFile(folder() / "one/unit.toml", "absent = [\"/tmp\"]\n");
    writeFile(expected() / "tmp.list", "(absent)\n");
    EXPECT_EQ(differences(), Lines{});
}

TEST_F(CaseCheckTest, UpdateWritesAnExpectationThatPasses) {
    fs::remove_all(expected());
    writeFile(folder() / "one/arguments", "-a\n-x\n");
    EXPECT_TRUE(check(true).isUpdate);
    EXPECT_EQ(readFile(expected() / "tmp.list"), "airplay.conf\n");
    EXPECT_EQ(readFile(expected() / "tmp/airplay.conf"), "stock\n");
    EXPECT_NE(readFile(expected() / "stderr").find("'x'"), std::string::npos);
    EXPECT_EQ(differences(), Lines{});
    EXPECT_EQ(folderNames(folder() / "one"),
              (std::set<std::string>{"arguments", "expected", "unit.toml"}));
}

TEST_F(CaseCheckTest, UpdateReplacesTheFilesOfItsTableAndNoOther) {
    writeFile(expected() / "tmp.list", "airplay.conf\nolder\nfolder/\nfolder/older\n");
    writeFile(expected() / "stderr", "of before\n");
    writeFile(expected() / "tmp/airplay.conf", "of before\n");
    writeFile(expected() / "tmp/older", "of before\n");
    writeFile(expected() / "notes", "of a person\n");
    writeFile(expected() / "tmp/notes", "of a person\n");
    for (const char* name : {"more", "tmp/folder", "empty"}) {
        fs::create_directory(expected() / name);
    }
    writeFile(expected() / "tmp/folder/older", "of before\n");
    writeFile(expected() / "more/notes", "of a person\n");
    fs::create_symlink("/none", expected() / "more/link");
    fs::create_symlink("notes", expected() / "link");
    EXPECT_EQ(updated().update, desk::CaseUpdate::done);
    EXPECT_EQ(expectation(), (Files{{"tmp.list", "airplay.conf\n"},
                                    {"tmp/airplay.conf", "stock\n"},
                                    {"notes", "of a person\n"},
                                    {"tmp/notes", "of a person\n"},
                                    {"more/notes", "of a person\n"},
                                    {"more/link", "/none"},
                                    {"link", "notes"}}));
    EXPECT_EQ(folderNames(expected()),
              (std::set<std::string>{"empty", "link", "more", "notes", "tmp", "tmp.list"}));
    EXPECT_EQ(folderNames(expected() / "tmp"), (std::set<std::string>{"airplay.conf", "notes"}));
    EXPECT_EQ(fs::hard_link_count(expected() / "notes"), 1U);
    EXPECT_EQ(differences(), Lines{});
}

/// A list is only text: it names nothing outside.
TEST_F(CaseCheckTest, PresentListNamesNothingOutside) {
    writeFile(folder() / "mine", "kept");
    writeFile(folder() / "one/mine", "kept");
    writeFile(expected() / "tmp.list", "../../mine\n../../../mine\n/etc/hostname\n");
    EXPECT_EQ(updated().update, desk::CaseUpdate::done);
    EXPECT_EQ(readFile(folder() / "mine"), "kept");
    EXPECT_EQ(readFile(folder() / "one/mine"), "kept");
}

TEST_F(CaseCheckTest, ExpectationThatHoldsIsNotTouched) {
    const auto before = treeStates(folder());
    letTimePass();
    EXPECT_EQ(updated().update, desk::CaseUpdate::needless);
    // The folder of the case lies in the one whose times a listing does not change.
    EXPECT_EQ(treeStates(folder()), before);
}

TEST_F(CaseCheckTest, UpdateRefusesLinks) {
    const TemporaryFolder elsewhere;
    const fs::path out = elsewhere.path() / "out";
    for (const std::string path : {"one", "one/expected", "one/expected/tmp",
                                   "one/expected/tmp.list", "one/expected/stderr"}) {
        SCOPED_TRACE(path);
        writeFile(expected() / "tmp.list", "older\n");
        writeFile(expected() / "stderr", "older\n");
        fs::rename(folder() / path, out);
        fs::create_symlink(out, folder() / path);
        const auto before = treeStates(elsewhere.path());
        letTimePass();
        const CaseResult result = updated();
        EXPECT_EQ(result.update, desk::CaseUpdate::refused);
        EXPECT_EQ(result.fault, "cannot update " + (folder() / path).string() + ": it is a link");
        EXPECT_EQ(treeStates(elsewhere.path()), before);
        fs::remove(folder() / path);
        fs::rename(out, folder() / path);
    }
}

/// A folder of /tmp that the unit brings along stands deeper in the expectation.
TEST_F(CaseCheckTest, UpdateWritesThroughNoLinkBelow) {
    writeFile(folder() / "one/unit.toml", "[files]\n\"/tmp/folder/deep/note\" = \"unit\\n\"\n");
    const fs::path out = folder() / "out";
    for (const char* const path : {"tmp/folder", "tmp/folder/deep"}) {
        fs::remove_all(out);
        fs::create_directories(out / "deep");
        writeFile(out / "note", "keep\n");
        writeFile(out / "deep/note", "keep\n");
        fs::remove_all(expected() / "tmp");
        fs::create_directories((expected() / path).parent_path());
        fs::create_symlink(out, expected() / path);
        const CaseResult result = updated();
        EXPECT_EQ(result.update, desk::CaseUpdate::refused) << path;
        EXPECT_EQ(result.fault, "cannot update " + (expected() / path).string() + ": it is a link");
        EXPECT_EQ(readFile(out / "note"), "keep\n") << path;
        EXPECT_EQ(readFile(out / "deep/note"), "keep\n") << path;
    }
}

/// Nobody writes into the pipes, and a signal would not end the wait.
TEST_F(CaseCheckTest, PipeInACaseIsRefusedAtOnce) {
    for (const char* const path : {"unit.toml", "arguments", "expected/tmp.list",
                                   "expected/tmp/airplay.conf", "expected/stderr"}) {
        const fs::path file = folder() / "one" / path;
        const std::string former = fs::exists(file) ? readFile(file) : "";
        fs::remove(file);
        ASSERT_EQ(::mkfifo(file.c_str(), 0600), 0);
        const CaseResult result = check().cases.at(0);
        EXPECT_EQ(result.fault, file.string() + " is not a regular file");
        fs::remove(file);
        writeFile(file, former);
    }
}

TEST_F(CaseCheckTest, UpdateRefusesAProgramThatIsNotTheTool) {
    writeFile(expected() / "tmp.list", "older\n");
    const Files before = expectation();
    const auto expectRefused = [&](const std::string& script, const std::string& trait) {
        SCOPED_TRACE(script);
        writeFile(folder() / "one/arguments", "-c\n" + script + "\n");
        const CaseResult result = updated("/bin/sh");
        EXPECT_EQ(result.update, desk::CaseUpdate::refused);
        const Lines& found = result.differences;
        EXPECT_EQ(std::count(found.begin(), found.end(), trait), 1);
        EXPECT_EQ(expectation(), before);
    };
    expectRefused("exit 3", "exit status 3");
    expectRefused("echo text", "standard output is not empty");
    expectRefused("echo text >&2", "standard error is not a line for each unknown option");
    expectRefused("echo > /tmp/mine", "/tmp/mine has been made and is not an output");
    writeFile(folder() / "one/unit.toml", "[files]\n\"/tmp/mine\" = \"\"\n");
    expectRefused("echo > /tmp/mine", "/tmp/mine has been changed and is not an output");
    // No option of orvane is given, so this is not an output, either.
    expectRefused("echo > /tmp/iap1.cfg", "/tmp/iap1.cfg has been made and is not an output");
}

TEST_F(CaseCheckTest, UpdateRefusesARunThatIsNotAsExplained) {
    writeFile(expected() / "tmp.list", "older\n");
    const Files before = expectation();
    const CaseResult result = updated("/bin/true");
    EXPECT_EQ(result.update, desk::CaseUpdate::refused);
    EXPECT_EQ(result.surprises, Lines{"/tmp/airplay.conf is not what the explanation says"});
    EXPECT_EQ(expectation(), before);
}

TEST_F(CaseCheckTest, UpdateRefusesAProgramThatDoesNotComplainOfAnUnknownOption) {
    writeFile(folder() / "one/arguments", "-xy\n-a\n");
    EXPECT_EQ(updated().update, desk::CaseUpdate::done);
    writeFile(folder() / "one/arguments", "-xy\n");
    EXPECT_EQ(updated("/bin/true").differences,
              Lines{"standard error is not a line for each unknown option"});
}

TEST_F(CaseCheckTest, OutputThatIsALinkIsRecorded) {
    writeFile(folder() / "one/unit.toml", "[files]\n\"/fs/mp/etc/airplay.conf\" = \"stock\\n\"\n"
                                          "[links]\n\"/tmp/airplay.conf\" = \"/tmp/other\"\n");
    const CaseResult result = updated();
    EXPECT_EQ(result.differences, Lines{});
    EXPECT_EQ(result.update, desk::CaseUpdate::done);
    EXPECT_EQ(readFile(expected() / "tmp.list"), "airplay.conf\nother\n");
}

TEST_F(CaseCheckTest, NextCasesFollowABadOne) {
    for (const char* name : {"bad", "two"}) {
        fs::create_directory(folder() / name);
    }
    writeFile(folder() / "bad/unit.toml", "[image]\nsize = \"big\"\n");
    writeFile(folder() / "two/unit.toml", "");
    for (const bool updates : {true, false}) {
        const CheckReport report = check(updates);
        ASSERT_EQ(report.cases.size(), 3U);
        EXPECT_EQ(report.cases[0].fault.find((folder() / "bad/unit.toml:2:8: ").string()), 0U)
            << report.cases[0].fault;
        EXPECT_FALSE(report.cases[0].isAsExpected());
        EXPECT_EQ(report.cases[1].name, "one");
        EXPECT_TRUE(report.cases[1].isAsExpected());
        EXPECT_EQ(report.cases[2].name, "two");
        EXPECT_TRUE(report.cases[2].isAsExpected());
    }
}

TEST_F(CaseCheckTest, UpdateChangesNothingElse) {
    writeFile(expected() / "tmp.list", "older\n");
    writeFile(folder() / "one/notes", "of a person\n");
    fs::create_directory(folder() / "no_case");
    const std::string unit = readFile(folder() / "one/unit.toml");
    check(true);
    EXPECT_EQ(folderNames(folder()), (std::set<std::string>{"no_case", "one"}));
    EXPECT_EQ(folderNames(folder() / "one"),
              (std::set<std::string>{"arguments", "expected", "notes", "unit.toml"}));
    EXPECT_EQ(folderNames(expected()), (std::set<std::string>{"tmp", "tmp.list"}));
    EXPECT_EQ(readFile(folder() / "one/unit.toml"), unit);
    EXPECT_EQ(readFile(folder() / "one/arguments"), "-a\n");
    EXPECT_EQ(readFile(folder() / "one/notes"), "of a person\n");
}

TEST_F(CaseCheckTest, FoldersInTmpAreExpectedByTheirNames) {
    writeFile(folder() / "one/unit.toml", "folders = [\"/tmp/airplay.conf\"]\n");
    EXPECT_EQ(differences(),
              (Lines{"/tmp/airplay.conf is missing", "/tmp/airplay.conf/ is not expected"}));
    check(true);
    EXPECT_EQ(readFile(expected() / "tmp.list"), "airplay.conf/\n");
    EXPECT_EQ(differences(), Lines{});
}

/// The binary is not the tool: it leaves nothing, and its exit status is 1.
TEST_F(CaseCheckTest, RunThatIsNotAsExplainedIsReported) {
    for (const bool updates : {false, true}) {
        const CaseResult result = desk::checkCases(folder(), "/bin/false", updates).cases.at(0);
        EXPECT_EQ(result.surprises, Lines{"/tmp/airplay.conf is not what the explanation says"});
        ASSERT_FALSE(result.differences.empty());
        EXPECT_EQ(result.differences[0], "exit status 1");
        EXPECT_EQ(result.differences.size(), updates ? 1U : 2U);
        EXPECT_EQ(readFile(expected() / "tmp.list"), "airplay.conf\n");
    }
}

/// The run makes a file that its owner may not read.
TEST_F(CaseCheckTest, UnreadableOutputIsBadInputAndNotRecorded) {
    writeFile(folder() / "one/arguments", "-c\numask 777; echo > /tmp/closed\n");
    { const kit::EnteredRoot once(folder()); } // a user namespace restores privileges
    const EnforcedPermissions hold;
    for (const bool updates : {false, true}) {
        EXPECT_EQ(desk::checkCases(folder(), "/bin/sh", updates).cases.at(0).fault,
                  "cannot read /tmp/closed: Permission denied");
    }
    EXPECT_EQ(readFile(expected() / "tmp.list"), "airplay.conf\n");
}

TEST_F(CaseCheckTest, CaseThatCannotBeReadIsBadInput) {
    { const kit::EnteredRoot once(folder()); }
    const EnforcedPermissions hold;
    const fs::path paths[] = {expected() / "tmp.list", folder() / "one/arguments",
                              folder() / "one"};
    for (const fs::path& path : paths) {
        fs::permissions(path, fs::perms::none);
        const fs::path named = path == folder() / "one" ? path / "unit.toml" : path;
        EXPECT_EQ(check().cases.at(0).fault,
                  "cannot read " + named.string() + ": Permission denied");
        fs::permissions(path, fs::perms::owner_all);
    }
    fs::permissions(folder(), fs::perms::none);
    EXPECT_EQ(refusalOf([&] { check(); }),
              "cannot read " + folder().string() + ": Permission denied");
    fs::permissions(folder(), fs::perms::owner_all);
}

TEST_F(CaseCheckTest, ExpectationThatCannotBeReplacedIsBadInput) {
    { const kit::EnteredRoot once(folder()); }
    const EnforcedPermissions hold;
    writeFile(expected() / "tmp.list", "older\n");
    for (const fs::path& path : {expected(), expected() / "tmp", folder() / "one"}) {
        fs::permissions(path, fs::perms::owner_read | fs::perms::owner_exec);
        const std::string begin =
            path == folder() / "one" ? "cannot make a folder in " : "cannot write ";
        EXPECT_EQ(updated().fault, begin + path.string() + ": Permission denied");
        fs::permissions(path, fs::perms::owner_all);
        EXPECT_EQ(readFile(expected() / "tmp.list"), "older\n");
    }
}

TEST_F(CaseCheckTest, NothingIsWrittenWithoutUpdate) {
    fs::remove_all(expected());
    check();
    EXPECT_FALSE(fs::exists(expected()));
}

TEST_F(CaseCheckTest, WithoutArgumentsBothWritersRun) {
    fs::remove(folder() / "one/arguments");
    EXPECT_EQ(differences().size(), 3U); // the three iAP files are not expected
}

TEST_F(CaseCheckTest, BadDescriptionAndMissingBinaryAreBadInput) {
    EXPECT_THROW(desk::checkCases(folder(), "/none/orvane", false), kit::KitError);
    writeFile(folder() / "one/unit.toml", "[image]\nsize = \"big\"\n");
    EXPECT_NE(check().cases.at(0).fault, "");
}

TEST(CaseCheckFolderTest, FolderWithoutUnitsIsBadInput) {
    const TemporaryFolder folder;
    EXPECT_THROW(desk::checkCases(folder.path(), ORVANE_BINARY, false), kit::KitError);
    EXPECT_THROW(desk::checkCases(folder.path() / "none", ORVANE_BINARY, false), kit::KitError);
}

TEST(CaseCheckFolderTest, GoldenUnitsAgreeWithTheirExplanations) {
    const CheckReport report = desk::checkCases(ORVANE_GOLDEN_DIR, ORVANE_BINARY, false);
    for (const CaseResult& result : report.cases) {
        EXPECT_EQ(result.differences, Lines{}) << result.name;
        EXPECT_EQ(result.surprises, Lines{}) << result.name;
    }
    EXPECT_TRUE(report.unreached.empty()) << report.unreached.front();
}

} // namespace

} // namespace orvane::test
