// SPDX-License-Identifier: Apache-2.0
#include "kit/enter/entered_root.h"
#include "kit/enter/run_inside.h"
#include "kit/host/kit_error.h"
#include "orvane_unit/check/case_check.h"
#include "tests/kit/unit/described_unit.h"
#include "tests/support/folder_names.h"
#include "tests/support/permissions.h"
#include "tests/support/temporary_folder.h"
#include "tests/support/unit_test.h"

#include <gtest/gtest.h>

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
    fs::create_directories(expected() / "tmp");
    writeFile(expected() / "tmp/left_over", "of before\n");
    writeFile(folder() / "one/arguments", "-a\n-x\n");
    EXPECT_TRUE(check(true).isUpdate);
    EXPECT_EQ(readFile(expected() / "tmp.list"), "airplay.conf\n");
    EXPECT_EQ(readFile(expected() / "tmp/airplay.conf"), "stock\n");
    EXPECT_NE(readFile(expected() / "stderr").find("'x'"), std::string::npos);
    EXPECT_FALSE(fs::exists(expected() / "tmp/left_over"));
    EXPECT_EQ(differences(), Lines{});
}

TEST_F(CaseCheckTest, UpdateChangesNothingElse) {
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
    }
}

/// The run makes a file that its owner may not read.
TEST_F(CaseCheckTest, UnreadableOutputIsBadInputAndNotRecorded) {
    writeFile(folder() / "one/arguments", "-c\numask 777; echo > /tmp/closed\n");
    { const kit::EnteredRoot once(folder()); } // a user namespace restores privileges
    const EnforcedPermissions hold;
    for (const bool updates : {false, true}) {
        EXPECT_EQ(refusalOf([&] { desk::checkCases(folder(), "/bin/sh", updates); }),
                  "cannot read /tmp/closed: Permission denied");
    }
    EXPECT_EQ(readFile(expected() / "tmp.list"), "airplay.conf\n");
}

TEST_F(CaseCheckTest, CaseThatCannotBeReadIsBadInput) {
    { const kit::EnteredRoot once(folder()); }
    const EnforcedPermissions hold;
    const fs::path paths[] = {expected() / "tmp.list", folder() / "one/arguments", folder() / "one",
                              folder()};
    for (const fs::path& path : paths) {
        fs::permissions(path, fs::perms::none);
        const fs::path named = path == folder() / "one" ? path / "unit.toml" : path;
        EXPECT_EQ(refusalOf([&] { check(); }),
                  "cannot read " + named.string() + ": Permission denied");
        fs::permissions(path, fs::perms::owner_all);
    }
}

TEST_F(CaseCheckTest, ExpectationThatCannotBeReplacedIsBadInput) {
    { const kit::EnteredRoot once(folder()); }
    const EnforcedPermissions hold;
    fs::permissions(expected(), fs::perms::owner_read | fs::perms::owner_exec);
    EXPECT_EQ(refusalOf([&] { check(true); }),
              "cannot write " + expected().string() + ": Permission denied");
    fs::permissions(expected(), fs::perms::owner_all);
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
    EXPECT_THROW(check(), kit::KitError);
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
