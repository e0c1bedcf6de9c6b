// SPDX-License-Identifier: Apache-2.0
//
// Which entries replace others when a unit is made: files, links, folders and absent paths replace
// standard folders, image and disk.
#include "kit/description/unit_description.h"
#include "kit/unit/make_unit.h"
#include "tests/kit/unit/unit_tree.h"
#include "tests/support/temporary_folder.h"
#include "tests/support/unit_test.h"

#include <gtest/gtest.h>
#include <sys/stat.h>

#include <filesystem>
#include <set>
#include <string>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;

using Paths = std::set<std::string>;

class MakeUnitPlacesTest : public ::testing::Test {
protected:
    fs::path root() const { return folder_.path() / "unit"; }

    /// Makes the unit and returns its paths.
    Paths make(const kit::UnitDescription& unit) const {
        kit::makeUnit(unit, root());
        Paths paths;
        for (const auto& [path, content] : treeOf(root())) {
            paths.insert(path);
        }
        return paths;
    }

private:
    TemporaryFolder folder_;
};

TEST_F(MakeUnitPlacesTest, LinksHoldAnyTarget) {
    kit::UnitDescription unit;
    unit.links = {{"/tmp/a", "nowhere"},        {"/tmp/b", "/etc/hostname"},
                  {"/new/deep/c", "../../tmp"}, {"/tmp/d", "d"},
                  {"/tmp/\xFF", "\xFE\n"},      {"/tmp/long", std::string(4000, 'l')}};
    kit::makeUnit(unit, root());
    for (const auto& [path, target] : unit.links) {
        EXPECT_EQ(fs::read_symlink(root() / path.substr(1)).string(), target) << path;
    }
}

TEST_F(MakeUnitPlacesTest, LinkReplacesImageAndDiskAndIsNotFollowed) {
    kit::UnitDescription unit;
    unit.image.params[22] = 1;
    unit.disk.slots[9] = "unused";
    unit.links = {{"/dev/hd0", "disk0"}, {IMAGE_PATH, "/tmp/image"}};
    const Paths paths = make(unit);
    EXPECT_TRUE(fs::is_symlink(root() / "dev/hd0"));
    EXPECT_EQ(paths.count("/dev/disk0") + paths.count("/tmp/image"), 0U);
}

TEST_F(MakeUnitPlacesTest, ValuesOfAReplacedImageOrDiskNeedNotFit) {
    kit::UnitDescription unit;
    unit.image.size = 0;
    unit.image.params[22] = 1;
    unit.disk.size = 0;
    unit.disk.slots[9] = "unused";
    unit.disk.bytes[5] = "unused";
    unit.links = {{"/dev/hd0", "disk0"}};
    unit.absent = {IMAGE_PATH};
    EXPECT_NO_THROW(kit::makeUnit(unit, root()));
}

TEST_F(MakeUnitPlacesTest, NothingIsMadeBelowALinkInPlaceOfAFolder) {
    const TemporaryFolder elsewhere;
    kit::UnitDescription unit;
    unit.links = {{"/fs", elsewhere.path()}, {"/dev", elsewhere.path()}, {"/tmp", "."}};
    EXPECT_EQ(make(unit), (Paths{"/fs", "/dev", "/tmp"}));
    EXPECT_TRUE(fs::is_empty(elsewhere.path()));
}

TEST_F(MakeUnitPlacesTest, FileInPlaceOfAFolderIsMadeWithItsParents) {
    kit::UnitDescription unit;
    unit.files = {{"/fs/mp/etc", "no folder"}, {"/dev", ""}, {"/fs/tmpfs", "x"}};
    unit.sparseFiles = {{"/tmp", {5, {}}}};
    EXPECT_EQ(make(unit), (Paths{"/dev", "/fs", "/fs/mp", "/fs/mp/etc", "/fs/rwdata",
                                 "/fs/rwdata/.Version", "/fs/tmpfs", "/tmp"}));
    EXPECT_EQ(readFile(root() / "fs/mp/etc"), "no folder");
    EXPECT_EQ(readFile(root() / "tmp"), std::string(5, '\0'));
}

TEST_F(MakeUnitPlacesTest, FolderThatAnotherEntryNeedsReplacesTheDisk) {
    kit::UnitDescription unit;
    unit.files = {{"/dev/hd0/deep/file", "x"}};
    make(unit);
    EXPECT_EQ(readFile(root() / "dev/hd0/deep/file"), "x");
}

TEST_F(MakeUnitPlacesTest, AbsentPathBelowALinkReachesNothingOutside) {
    const TemporaryFolder elsewhere;
    writeFile(elsewhere.path() / "mine", "kept");
    kit::UnitDescription unit;
    unit.links = {{"/tmp", elsewhere.path()}};
    unit.absent = {"/tmp/mine", "/fs", "/dev"};
    EXPECT_EQ(make(unit), Paths{"/tmp"});
    EXPECT_EQ(readFile(elsewhere.path() / "mine"), "kept");
}

TEST_F(MakeUnitPlacesTest, AbsentPathRemovesFilesLinksAndFoldersButNotParents) {
    kit::UnitDescription unit;
    unit.files = {{"/a/b/file", "x"}, {"/a/b-side", "x"}};
    unit.links = {{"/a/b/link", "x"}};
    unit.folders = {"/a/b/folder", "/c/d"};
    unit.absent = {"/a/b", "/c/d", "/fs", "/dev", "/tmp"};
    EXPECT_EQ(make(unit), (Paths{"/a", "/a/b-side", "/c"}));
}

TEST_F(MakeUnitPlacesTest, SparseFileHoldsItsBytesAndNeedsNoRoomForZeros) {
    kit::UnitDescription unit;
    unit.sparseFiles = {{"/new/disk0", {64 * MEBIBYTE, {{0, "begin"}, {64 * MEBIBYTE - 1, "e"}}}},
                        {"/empty", {0, {}}}};
    make(unit);
    const fs::path file = root() / "new/disk0";
    EXPECT_EQ(fs::file_size(file), 64 * MEBIBYTE);
    const std::string content = readFile(file);
    EXPECT_EQ(content.substr(0, 6), std::string("begin\0", 6));
    EXPECT_EQ(content.back(), 'e');
    EXPECT_EQ(content.find_first_not_of('\0', 5), 64 * MEBIBYTE - 1);
    struct stat state {};
    ASSERT_EQ(stat(file.c_str(), &state), 0);
    EXPECT_LT(state.st_blocks * 512, 1024 * 1024);
    EXPECT_EQ(fs::file_size(root() / "empty"), 0U);
}

TEST_F(MakeUnitPlacesTest, NameOfAnyBytesIsAccepted) {
    const std::string name = "/tmp/\x01\xFF \"\\\n\t'=#[";
    kit::UnitDescription unit;
    unit.files = {{name, "x"}};
    EXPECT_EQ(make(unit).count(name), 1U);
}

TEST_F(MakeUnitPlacesTest, FolderNamedTwiceIsMadeOnce) {
    kit::UnitDescription unit;
    unit.folders = {"/x", "/x", "/x/y"};
    EXPECT_EQ(make(unit).count("/x/y"), 1U);
}

} // namespace

} // namespace orvane::test
