// SPDX-License-Identifier: Apache-2.0
//
// What makeUnit refuses, with nothing left behind.
#include "kit/description/unit_description.h"
#include "kit/host/kit_error.h"
#include "kit/unit/make_unit.h"
#include "tests/kit/host/open_descriptors.h"
#include "tests/support/resource_limit.h"
#include "tests/support/temporary_folder.h"
#include "tests/support/unit_test.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <set>
#include <string>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;

/// A change that makes a good unit refused, and the message.
struct Refusal {
    void (*spoil)(kit::UnitDescription&);
    const char* message;
};

const Refusal REFUSALS[] = {
    {[](kit::UnitDescription& unit) { unit.image.params[0] = 1; },
     "there is no parameter 0, only 1 to 171"},
    {[](kit::UnitDescription& unit) { unit.image.params[172] = 1; },
     "there is no parameter 172, only 1 to 171"},
    {[](kit::UnitDescription& unit) { unit.image.params[22] = 256; },
     "parameter 22 is one byte: 256 does not fit"},
    {[](kit::UnitDescription& unit) {
         unit.image.params[134] = 1;
         unit.image.size = 134; // one byte of two
     },
     "parameter 134 ends at byte 135 of an image of 134 bytes"},
    {[](kit::UnitDescription& unit) { unit.image.bytes[178] = "ab"; },
     "the content at 178 ends at byte 180 of an image of 179 bytes"},
    {[](kit::UnitDescription& unit) { unit.disk.slots[18] = "x"; },
     "there is no slot 18, only 0 to 17"},
    {[](kit::UnitDescription& unit) { unit.disk.slots[9] = "123456789"; },
     "slot 9 takes 1 to 8 bytes, not 9"},
    {[](kit::UnitDescription& unit) { unit.disk.slots[9] = ""; },
     "slot 9 takes 1 to 8 bytes, not 0"},
    {[](kit::UnitDescription& unit) { unit.disk.aux = std::string(1025, 'x'); },
     "the auxiliary area takes 1 to 1024 bytes, not 1025"},
    {[](kit::UnitDescription& unit) { unit.disk.aux = ""; },
     "the auxiliary area takes 1 to 1024 bytes, not 0"},
    {[](kit::UnitDescription& unit) { unit.disk.tuning[10].raw = "x"; },
     "there is no tuning block 10, only 0 to 9"},
    {[](kit::UnitDescription& unit) { unit.disk.tuning[0].raw = std::string(189, 'x'); },
     "a tuning block has 188 bytes, not 189"},
    {[](kit::UnitDescription& unit) { unit.disk.tuning[2].fields["qwaNone"] = "x"; },
     "there is no tuning field \"qwaNone\""},
    {[](kit::UnitDescription& unit) {
         unit.disk.size = 1048575; // a byte less than the record area
         unit.disk.slots[0] = "x";
     },
     "slot 0 does not fit on a disk of 1048575 bytes: it needs 1048576"},
    {[](kit::UnitDescription& unit) {
         unit.disk = {};
         unit.disk.size = 0;
         unit.disk.aux = "x";
     },
     "the auxiliary area does not fit on a disk of 0 bytes: it needs 1045504"},
    {[](kit::UnitDescription& unit) {
         unit.disk = {};
         unit.disk.size = 0xFF000 - 1;
         unit.disk.tuning[0].raw = "x";
     },
     "the tuning area does not fit on a disk of 1044479 bytes: it needs 1044480"},
    {[](kit::UnitDescription& unit) { unit.disk.bytes[0x1FFFFF] = "ab"; },
     "the content at 2097151 ends at byte 2097153 of a disk of 2097152 bytes"},
    {[](kit::UnitDescription& unit) {
         unit.disk.bytes[~std::uint64_t{0}] = "ab"; // past the end, however it is counted
     },
     "the content at 18446744073709551615 ends at byte 1 of a disk of 2097152 bytes"},
    {[](kit::UnitDescription& unit) {
         unit.sparseFiles["/tmp/x"] = {3, {{2, "ab"}}};
     },
     "the content at 2 ends at byte 4 of a file of 3 bytes"},
    {[](kit::UnitDescription& unit) { unit.files["/tmp/file/below"] = "x"; },
     "/tmp/file/below lies below /tmp/file, which is a file, not a folder"},
    {[](kit::UnitDescription& unit) { unit.folders.emplace_back("/tmp/file/b/c"); },
     "/tmp/file/b/c lies below /tmp/file, which is a file, not a folder"},
    {[](kit::UnitDescription& unit) {
         unit.links = {{"/fs", "/"}};
         unit.files["/fs/mp/x"] = "x";
     },
     "/fs/mp/x lies below /fs, which is a link, not a folder"},
    {[](kit::UnitDescription& unit) { unit.folders.emplace_back("/tmp/file"); },
     "/tmp/file is both a file and a folder"},
    {[](kit::UnitDescription& unit) { unit.links["/tmp/file"] = "x"; },
     "/tmp/file is both a file and a link"},
    {[](kit::UnitDescription& unit) { unit.sparseFiles["/tmp/file"] = {}; },
     "/tmp/file is given twice"},
    {[](kit::UnitDescription& unit) { unit.links["/extra/folder"] = "x"; },
     "/extra/folder is both a link and a folder"},
    {[](kit::UnitDescription& unit) { unit.links["/x"] = ""; },
     "a link's target must have at least one byte, and none that is zero"},
    {[](kit::UnitDescription& unit) { unit.links["/x"] = std::string("a\0b", 3); },
     "a link's target must have at least one byte, and none that is zero"},
    {[](kit::UnitDescription& unit) { unit.files["/.orvane-unit"] = "x"; },
     "a path must not be /.orvane-unit, which is the kit's own mark: \"/.orvane-unit\""},
};

class MakeUnitRefusalTest : public ::testing::Test {
protected:
    const fs::path& folder() const { return folder_.path(); }
    fs::path root() const { return folder() / "unit"; }

    /// A unit with entries of every kind, so that anything left behind shows.
    static kit::UnitDescription wholeUnit() {
        kit::UnitDescription unit;
        unit.image.params[22] = 1;
        unit.disk.slots[9] = "SN004217";
        unit.folders = {"/extra/folder"};
        unit.files["/tmp/file"] = "x";
        return unit;
    }

    static std::string refusalOf(const kit::UnitDescription& unit, const fs::path& root) {
        try {
            kit::makeUnit(unit, root);
        } catch (const kit::KitError& error) {
            return error.what();
        }
        return "";
    }

    /// Requires a refusal with nothing left, whether `root` was absent or an empty folder.
    void expectNothingLeft(const kit::UnitDescription& unit, const std::string& message) const {
        const std::size_t before = openDescriptors();
        const fs::path hostCwd = fs::current_path();
        EXPECT_EQ(refusalOf(unit, root()), message);
        EXPECT_FALSE(fs::exists(root()));
        fs::create_directory(root());
        EXPECT_EQ(refusalOf(unit, root()), message);
        EXPECT_TRUE(fs::is_directory(root()) && fs::is_empty(root()));
        fs::remove_all(root());
        EXPECT_EQ(openDescriptors(), before);
        EXPECT_EQ(fs::current_path(), hostCwd);
    }

private:
    TemporaryFolder folder_;
};

TEST_F(MakeUnitRefusalTest, ValueThatDoesNotFitIsNamedAndLeavesNothing) {
    for (const Refusal& refusal : REFUSALS) {
        SCOPED_TRACE(refusal.message);
        kit::UnitDescription unit = wholeUnit();
        refusal.spoil(unit);
        expectNothingLeft(unit, refusal.message);
    }
}

TEST_F(MakeUnitRefusalTest, PathThatIsNotPlainIsNamedAndLeavesNothing) {
    for (const std::string& path :
         {std::string(), std::string("/"), std::string("tmp/x"), std::string("/tmp/../../x"),
          std::string("/tmp/./x"), std::string("//tmp/x"), std::string("/tmp//x"),
          std::string("/tmp/x/"), std::string("/tmp/..\0x", 9)}) {
        const std::string message = "a path must be absolute and have no \".\", \"..\" or needless "
                                    "\"/\", and no zero byte, unlike \"" +
                                    path + "\"";
        kit::UnitDescription unit = wholeUnit();
        unit.files[path] = "x";
        EXPECT_EQ(refusalOf(unit, root()), message.substr(0, message.find('\0')));
        EXPECT_FALSE(fs::exists(root()));
        unit = wholeUnit();
        unit.folders = {path};
        EXPECT_NE(refusalOf(unit, root()), "");
        unit = wholeUnit();
        unit.absent = {path};
        EXPECT_NE(refusalOf(unit, root()), "");
        EXPECT_TRUE(fs::is_empty(folder()));
    }
}

TEST_F(MakeUnitRefusalTest, DiskThatTheSystemRefusesIsNamedAndLeavesNothing) {
    const ResourceLimit limit(RLIMIT_FSIZE, 4096);
    expectNothingLeft(wholeUnit(),
                      "cannot make " + (root() / "dev/hd0").string() + ": File too large");
}

TEST_F(MakeUnitRefusalTest, FileThatTheSystemRefusesIsNamedAndLeavesNothing) {
    const ResourceLimit limit(RLIMIT_FSIZE, 4096);
    kit::UnitDescription unit = wholeUnit();
    unit.absent = {"/dev/hd0"};
    unit.files["/tmp/file"] = std::string(5000, 'x');
    expectNothingLeft(unit, "cannot write " + (root() / "tmp/file").string() + ": File too large");
}

TEST_F(MakeUnitRefusalTest, FolderThatIsNotEmptyIsRefusedAndLeft) {
    fs::create_directory(root());
    writeFile(root() / ".hidden", "kept");
    EXPECT_EQ(refusalOf({}, root()),
              root().string() + " is there already and is not an empty folder");
    EXPECT_EQ(folderNames(root()), (std::set<std::string>{".hidden"}));
    EXPECT_EQ(readFile(root() / ".hidden"), "kept");
}

TEST_F(MakeUnitRefusalTest, FolderWithAnEmptyFolderIsRefusedAndLeft) {
    fs::create_directories(root() / "tmp");
    EXPECT_NE(refusalOf({}, root()), "");
    EXPECT_EQ(folderNames(root()), (std::set<std::string>{"tmp"}));
}

TEST_F(MakeUnitRefusalTest, FileIsRefusedAndLeft) {
    writeFile(root(), "");
    EXPECT_EQ(refusalOf({}, root()),
              root().string() + " is there already and is not an empty folder");
    EXPECT_TRUE(fs::is_regular_file(root()));
}

TEST_F(MakeUnitRefusalTest, DanglingLinkIsRefusedAndLeft) {
    fs::create_symlink("missing", root());
    EXPECT_EQ(refusalOf({}, root()).rfind("cannot make " + root().string() + ": ", 0), 0U);
    EXPECT_TRUE(fs::is_symlink(root()));
    EXPECT_EQ(folderNames(folder()), (std::set<std::string>{"unit"}));
}

TEST_F(MakeUnitRefusalTest, ParentOfTheRootIsNotMade) {
    const fs::path deep = root() / "deep";
    EXPECT_EQ(refusalOf({}, deep), "cannot make " + deep.string() + ": No such file or directory");
    EXPECT_FALSE(fs::exists(root()));
}

} // namespace

} // namespace orvane::test
