// SPDX-License-Identifier: Apache-2.0
#include "kit/enter/entered_root.h"
#include "kit/host/kit_error.h"
#include "orvane_unit/check/tmp_tree.h"
#include "tests/support/permissions.h"
#include "tests/support/temporary_folder.h"
#include "tests/support/unit_test.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <map>
#include <optional>
#include <string>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;
using desk::TmpTree;

class TmpTreeTest : public ::testing::Test {
protected:
    TmpTreeTest() { fs::create_directory(tmp()); }

    const fs::path& root() const { return folder_.path(); }
    fs::path tmp() const { return root() / "tmp"; }

    std::string refusal() const {
        try {
            desk::readTmp(root());
        } catch (const kit::KitError& error) {
            return error.what();
        }
        return "";
    }

    /// The refusal while `path` has no permissions.
    std::string refusalWithout(const fs::path& path) const {
        { const kit::EnteredRoot once(root()); } // a user namespace restores privileges
        const EnforcedPermissions hold;
        fs::permissions(path, fs::perms::none);
        std::string text = refusal();
        fs::permissions(path, fs::perms::owner_all);
        return text;
    }

private:
    TemporaryFolder folder_;
};

TEST_F(TmpTreeTest, EntriesOfAllKindsAreListed) {
    fs::create_directories(tmp() / "a/b");
    writeFile(tmp() / "a/b/file", "text");
    writeFile(tmp() / "empty", "");
    fs::create_symlink("/tmp/a/b/file", tmp() / "to_file");
    fs::create_symlink("a", tmp() / "to_folder");
    fs::create_symlink("/none", tmp() / "to_nothing");
    fs::create_symlink("circle", tmp() / "circle");
    const TmpTree tree = desk::readTmp(root());
    EXPECT_TRUE(tree.isThere);
    const std::map<std::string, std::optional<std::string>> expected = {
        {"a/", {}},          {"a/b/", {}},       {"a/b/file", "text"}, {"empty", ""},
        {"to_file", "text"}, {"to_folder/", {}}, {"to_nothing", {}},   {"circle", {}}};
    EXPECT_EQ(tree.entries, expected);
}

TEST_F(TmpTreeTest, TmpThatIsNotAFolderIsNone) {
    fs::remove(tmp());
    EXPECT_FALSE(desk::readTmp(root()).isThere);
    writeFile(tmp(), "");
    EXPECT_FALSE(desk::readTmp(root()).isThere);
    fs::remove(tmp());
    fs::create_symlink("tmp", tmp());
    EXPECT_FALSE(desk::readTmp(root()).isThere);
}

TEST_F(TmpTreeTest, TmpThatCannotBeListedIsRefused) {
    writeFile(tmp() / "file", "text");
    EXPECT_EQ(refusalWithout(tmp()), "cannot read /tmp: Permission denied");
}

TEST_F(TmpTreeTest, SubfolderThatCannotBeListedIsRefused) {
    fs::create_directories(tmp() / "b/closed");
    writeFile(tmp() / "a", "text");
    writeFile(tmp() / "c", "text");
    EXPECT_EQ(refusalWithout(tmp() / "b/closed"), "cannot read /tmp/b/closed: Permission denied");
}

TEST_F(TmpTreeTest, FileThatCannotBeReadIsRefused) {
    writeFile(tmp() / "closed", "text");
    EXPECT_EQ(refusalWithout(tmp() / "closed"), "cannot read /tmp/closed: Permission denied");
}

} // namespace

} // namespace orvane::test
