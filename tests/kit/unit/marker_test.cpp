// SPDX-License-Identifier: Apache-2.0
#include "kit/description/unit_description.h"
#include "kit/enter/entered_root.h"
#include "kit/host/kit_error.h"
#include "kit/unit/make_unit.h"
#include "kit/unit/marker.h"
#include "tests/support/permissions.h"
#include "tests/support/temporary_folder.h"
#include "tests/support/unit_test.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <string>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;

constexpr char MARK[] = "made by orvane-unit, layout 1\n";

class MarkerTest : public ::testing::Test {
protected:
    fs::path root() const { return folder_.path() / "unit"; }
    fs::path mark() const { return root() / ".orvane-unit"; }

    static std::string refusalOf(const fs::path& root) {
        try {
            kit::requireKitUnit(root);
        } catch (const kit::KitError& error) {
            return error.what();
        }
        return "";
    }

    void expectNoUnit(const std::string& has) const {
        EXPECT_FALSE(kit::isKitUnit(root()));
        EXPECT_EQ(refusalOf(root()),
                  root().string() + " is not a unit that orvane-unit made: it has " + has);
    }

private:
    TemporaryFolder folder_;
};

TEST_F(MarkerTest, EveryUnitThatIsMadeHasTheMark) {
    kit::makeUnit({}, root());
    EXPECT_EQ(readFile(mark()), MARK);
    EXPECT_TRUE(kit::isKitUnit(root()));
    EXPECT_EQ(refusalOf(root()), "");
}

TEST_F(MarkerTest, MarkIsThereWhateverElseIsAbsent) {
    kit::UnitDescription unit;
    unit.absent = {"/fs", "/dev", "/tmp"};
    kit::makeUnit(unit, root());
    EXPECT_TRUE(kit::isKitUnit(root()));
}

TEST_F(MarkerTest, UnitIsRecognisedThroughALink) {
    kit::makeUnit({}, root());
    const fs::path link = root().parent_path() / "link";
    fs::create_directory_symlink("unit", link);
    EXPECT_TRUE(kit::isKitUnit(link));
    EXPECT_EQ(refusalOf(link), "");
}

TEST_F(MarkerTest, FolderWithoutTheMarkIsNotAUnit) {
    fs::create_directories(root() / "fs");
    expectNoUnit("no file .orvane-unit");
}

TEST_F(MarkerTest, OtherContentIsNotAMark) {
    fs::create_directory(root());
    for (const std::string& text : {std::string(), std::string("made by orvane-unit, layout 1"),
                                    std::string("made by orvane-unit, layout 2\n"),
                                    MARK + std::string("\n"), MARK + std::string(1, '\0')}) {
        SCOPED_TRACE(text);
        writeFile(mark(), text);
        expectNoUnit("another .orvane-unit");
    }
}

TEST_F(MarkerTest, FolderOrLinkIsNotAMark) {
    fs::create_directories(mark());
    expectNoUnit("another .orvane-unit");
    fs::remove(mark());
    writeFile(root() / "text", MARK);
    fs::create_symlink("text", mark());
    expectNoUnit("another .orvane-unit");
}

TEST_F(MarkerTest, MarkThatCannotBeReadIsNotTakenForNone) {
    kit::makeUnit({}, root());
    const EnforcedPermissions enforced;
    fs::permissions(mark(), fs::perms::none);
    EXPECT_EQ(refusalOf(root()), "cannot read " + mark().string() + ": Permission denied");
    fs::permissions(root(), fs::perms::none);
    EXPECT_EQ(refusalOf(root()), "cannot read " + mark().string() + ": Permission denied");
    fs::permissions(root(), fs::perms::owner_all);
}

TEST_F(MarkerTest, AnythingButAFolderIsRefused) {
    EXPECT_FALSE(kit::isKitUnit(root()));
    EXPECT_EQ(refusalOf(root()), "cannot read " + root().string() + ": No such file or directory");
    writeFile(root(), MARK);
    EXPECT_FALSE(kit::isKitUnit(root()));
    EXPECT_EQ(refusalOf(root()), root().string() + " is not a folder");
}

TEST_F(MarkerTest, RootDirectoryIsRefusedMarkedOrNot) {
    EXPECT_EQ(refusalOf("/"), "/ is the root directory of this system, not a unit");
    kit::makeUnit({}, root());
    fs::create_directory_symlink("/", root() / "up");
    const kit::EnteredRoot entered(root());
    EXPECT_TRUE(kit::isKitUnit("/"));
    for (const std::string path : {"/", "/tmp/..", "/up", ".", "//", "/fs/../"}) {
        EXPECT_EQ(refusalOf(path), path + " is the root directory of this system, not a unit");
    }
}

} // namespace

} // namespace orvane::test
