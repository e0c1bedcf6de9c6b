// SPDX-License-Identifier: Apache-2.0
#include "kit/description/description_text.h"
#include "kit/description/parse_description.h"
#include "kit/host/host_file.h"
#include "kit/host/kit_error.h"
#include "kit/unit/describe_unit.h"
#include "kit/unit/make_unit.h"
#include "tests/kit/description/description_equality.h"
#include "tests/kit/description/random_unit.h"
#include "tests/kit/unit/unit_tree.h"
#include "tests/support/permissions.h"
#include "tests/support/temporary_folder.h"
#include "tests/support/unit_test.h"

#include <gtest/gtest.h>
#include <sys/stat.h>

#include <filesystem>
#include <string>
#include <vector>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;

using Paths = std::vector<std::string>;

class DescribeUnitTest : public ::testing::Test {
protected:
    fs::path root() const { return folder_.path() / "unit"; }
    fs::path other() const { return folder_.path() / "other"; }

    /// The description of a unit made from `unit`.
    kit::UnitDescription described(const kit::UnitDescription& unit) const {
        kit::makeUnit(unit, root());
        return kit::describeUnit(root());
    }

    std::string refusal() const {
        try {
            kit::describeUnit(root());
        } catch (const kit::KitError& error) {
            return error.what();
        }
        return "";
    }

private:
    TemporaryFolder folder_;
};

TEST_F(DescribeUnitTest, EmptyUnitIsDescribedAsEmpty) {
    EXPECT_TRUE(described({}) == kit::UnitDescription());
}

TEST_F(DescribeUnitTest, EachKindOfEntryIsDescribed) {
    kit::UnitDescription unit;
    unit.image.params[22] = 1;
    unit.disk.slots[9] = "SN004217";
    unit.files = {{"/tmp/file", "x"}, {"/short", std::string(4095, '\0')}};
    unit.sparseFiles = {{"/long", {4096, {}}}, {"/longer", {100000, {{99999, "e"}}}}};
    unit.links = {{"/tmp/link", "nowhere"}, {"/dev/loop", "loop"}};
    unit.folders = {"/a/b/c", "/fs/mp/etc/mm/iap2.cfg", "/tmp/folder"};
    EXPECT_TRUE(described(unit) == unit);
}

TEST_F(DescribeUnitTest, MissingEntriesAreAbsentByTheirTopmostPath) {
    kit::UnitDescription unit;
    unit.absent = {"/dev/hd0", "/fs/mp", "/fs/tmpfs", "/tmp"};
    EXPECT_EQ(described(unit).absent, unit.absent);
    fs::remove_all(root() / "fs");
    EXPECT_EQ(kit::describeUnit(root()).absent, (Paths{"/dev/hd0", "/fs", "/tmp"}));
    fs::remove_all(root() / "dev");
    EXPECT_EQ(kit::describeUnit(root()).absent, (Paths{"/dev", "/fs", "/tmp"}));
}

TEST_F(DescribeUnitTest, ReplacedEntriesAreNotAbsent) {
    kit::UnitDescription unit;
    unit.links = {{"/fs/mp", "x"}, {"/dev/hd0", "disk0"}};
    unit.files = {{"/tmp", "no folder"}};
    unit.folders = {IMAGE_PATH};
    EXPECT_TRUE(described(unit) == unit);
}

TEST_F(DescribeUnitTest, LongImageIsDescribedAsAFile) {
    kit::makeUnit({}, root());
    fs::resize_file(root() / std::string(IMAGE_PATH).substr(1), std::uint64_t{5} << 30U);
    const kit::UnitDescription unit = kit::describeUnit(root());
    EXPECT_EQ(unit.sparseFiles.at(IMAGE_PATH), (kit::SparseFile{std::uint64_t{5} << 30U, {}}));
    kit::makeUnit(unit, other());
    EXPECT_EQ(fs::file_size(other() / std::string(IMAGE_PATH).substr(1)), std::uint64_t{5} << 30U);
}

TEST_F(DescribeUnitTest, LongDiskCostsAlmostNothing) {
    kit::UnitDescription unit;
    unit.disk.size = std::uint64_t{1} << 40U;
    unit.disk.slots[9] = "SN004217";
    unit.disk.bytes[5] = "x";
    EXPECT_TRUE(described(unit) == unit);
}

TEST_F(DescribeUnitTest, MarkIsNotPartOfIt) {
    kit::makeUnit({}, root());
    writeFile(root() / "tmp/.orvane-unit", "a file like any other");
    const kit::UnitDescription unit = kit::describeUnit(root());
    EXPECT_EQ(unit.files,
              (std::map<std::string, std::string>{{"/tmp/.orvane-unit", "a file like any other"}}));
}

TEST_F(DescribeUnitTest, AnythingButAUnitIsRefused) {
    EXPECT_EQ(refusal(), "cannot read " + root().string() + ": No such file or directory");
    fs::create_directories(root() / "fs");
    EXPECT_EQ(refusal(), root().string() +
                             " is not a unit that orvane-unit made: it has no file .orvane-unit");
}

TEST_F(DescribeUnitTest, EntryThatCannotBeDescribedIsRefusedByName) {
    kit::makeUnit({}, root());
    const fs::path pipe = root() / "tmp/pipe";
    ASSERT_EQ(::mkfifo(pipe.c_str(), 0600), 0);
    EXPECT_EQ(refusal(), pipe.string() + " is a pipe, not a file, a folder or a link");
}

TEST_F(DescribeUnitTest, EntryThatCannotBeReadIsRefusedByName) {
    kit::makeUnit({}, root());
    const fs::path locked = root() / "tmp/locked";
    for (const bool isFolder : {false, true}) {
        if (isFolder) {
            fs::remove(locked);
            fs::create_directory(locked);
        } else {
            writeFile(locked, "x");
        }
        fs::permissions(locked, fs::perms::none);
        std::string said;
        {
            const EnforcedPermissions permissions;
            said = refusal();
        }
        EXPECT_EQ(said, "cannot read " + locked.string() + ": Permission denied");
        fs::permissions(locked, fs::perms::owner_all);
    }
}

/// A unit made again from its description's text has the same tree and the same description.
TEST_F(DescribeUnitTest, RandomUnitsSurviveTheRoundTrip) {
    for (std::uint32_t seed = 0; seed < 200; ++seed) {
        SCOPED_TRACE(seed);
        const kit::UnitDescription found = described(RandomUnit(seed).unit());
        const std::string text = kit::descriptionText(found);
        const kit::UnitDescription again = kit::parseDescription(text, "unit.toml");
        ASSERT_TRUE(again == found);
        kit::makeUnit(again, other());
        ASSERT_EQ(differenceOf(treeOf(root()), treeOf(other())), "");
        ASSERT_TRUE(kit::describeUnit(other()) == found);
        fs::remove_all(root());
        fs::remove_all(other());
    }
}

} // namespace

} // namespace orvane::test
