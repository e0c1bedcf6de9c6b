// SPDX-License-Identifier: Apache-2.0
#include "kit/description/unit_description.h"
#include "kit/enter/entered_root.h"
#include "kit/host/kit_error.h"
#include "kit/unit/describe_inputs.h"
#include "tests/kit/description/description_equality.h"
#include "tests/kit/unit/source_unit.h"
#include "tests/support/permissions.h"

#include <gtest/gtest.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>

#include <filesystem>
#include <string>
#include <vector>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;

using Paths = std::vector<std::string>;
using Files = std::map<std::string, std::string>;

class DescribeInputsTest : public SourceUnitTest {
protected:
    /// The description; requires that the source is unchanged.
    kit::UnitDescription found() const {
        const auto before = state();
        kit::UnitDescription unit = kit::describeInputs(source());
        EXPECT_EQ(differenceOf(before, state()), "");
        return unit;
    }

    std::string refusal() const {
        try {
            kit::describeInputs(source());
        } catch (const kit::KitError& error) {
            return error.what();
        }
        return "";
    }
};

TEST_F(DescribeInputsTest, EmptySourceLacksImageAndDisk) {
    const kit::UnitDescription unit = found();
    kit::UnitDescription expected;
    expected.absent = {"/dev/hd0", IMAGE_PATH};
    EXPECT_TRUE(unit == expected);
    fs::remove_all(source());
    fs::create_directory(source());
    expected.absent = {"/dev", "/fs", "/tmp"};
    EXPECT_TRUE(found() == expected);
}

TEST_F(DescribeInputsTest, ImageIsDescribed) {
    std::string image(181, '\0');
    image[21] = 1;
    image[180] = 'x';
    put(IMAGE_PATH, image);
    kit::ImageDescription expected;
    expected.size = 181;
    expected.params[22] = 1;
    expected.bytes[180] = "x";
    EXPECT_TRUE(found().image == expected);
    EXPECT_EQ(found().absent, Paths{"/dev/hd0"});
}

TEST_F(DescribeInputsTest, LongImageIsAFile) {
    put(IMAGE_PATH, "x");
    fs::resize_file(at(IMAGE_PATH), std::uint64_t{3} << 30U);
    EXPECT_EQ(kit::describeInputs(source()).sparseFiles.at(IMAGE_PATH),
              (kit::SparseFile{std::uint64_t{3} << 30U, {{0, "x"}}}));
}

TEST_F(DescribeInputsTest, LastMebibyteOfTheDiskIsDescribed) {
    put("/dev/hd0", std::string(700, 'x') + std::string(129, '\0') + "SN004217" +
                        std::string(MEBIBYTE - 137, '\0'));
    kit::DiskDescription expected;
    expected.size = MEBIBYTE;
    expected.slots[9] = "SN004217";
    EXPECT_TRUE(found().disk == expected);
}

TEST_F(DescribeInputsTest, ShorterDiskIsDescribedWhole) {
    put("/dev/hd0", std::string(1000, '\0') + "x");
    kit::DiskDescription expected;
    expected.size = 1001;
    expected.bytes[1000] = "x";
    EXPECT_TRUE(found().disk == expected);
}

TEST_F(DescribeInputsTest, VersionFilesAreThoseThatTheToolReads) {
    const std::string folder = "/fs/rwdata/.Version/";
    put("/fs/rwdata/elsewhere", "Type=Application\n");
    put(folder + "a.inf", "a");
    put(folder + "b.info.old", "b");
    put(folder + ".inf", "");
    put(folder + "c.txt", "not taken");
    put(folder + "inf", "not taken");
    putFolder(folder + "d.inf/below.inf");
    putFolder(folder + "e");
    putLink(folder + "f.inf", "../elsewhere");
    putLink(folder + "g.inf", "/fs/rwdata/elsewhere");
    putLink(folder + "h.inf", "nowhere");
    putLink(folder + "i.inf", "i.inf");
    ASSERT_EQ(::mknod(at(folder + "j.inf").c_str(), S_IFSOCK | 0600U, 0), 0);
    const kit::UnitDescription unit = found();
    EXPECT_EQ(unit.files, (Files{{folder + ".inf", ""},
                                 {folder + "a.inf", "a"},
                                 {folder + "b.info.old", "b"},
                                 {folder + "f.inf", "Type=Application\n"},
                                 {folder + "g.inf", "Type=Application\n"}}));
    EXPECT_EQ(unit.folders, Paths{folder + "d.inf"});
    // These are listed, and can't be opened.
    EXPECT_EQ(unit.links, (Files{{folder + "h.inf", "h.inf"},
                                 {folder + "i.inf", "i.inf"},
                                 {folder + "j.inf", "j.inf"}}));
}

TEST_F(DescribeInputsTest, VersionFolderThatIsMissingOrNotAFolderIsAbsent) {
    const Paths expected = {"/dev/hd0", "/fs/rwdata/.Version", IMAGE_PATH};
    fs::remove_all(at("/fs/rwdata/.Version"));
    EXPECT_EQ(found().absent, expected);
    put("/fs/rwdata/.Version", "no folder");
    EXPECT_EQ(found().absent, expected);
    EXPECT_TRUE(found().files.empty());
}

TEST_F(DescribeInputsTest, HighestFolderThatIsMissingIsAbsent) {
    fs::remove_all(at("/fs/mp/etc/mm"));
    EXPECT_EQ(found().absent, (Paths{"/dev/hd0", "/fs/mp/etc/mm", IMAGE_PATH}));
    fs::remove_all(at("/fs/mp"));
    fs::remove_all(at("/dev"));
    EXPECT_EQ(found().absent, (Paths{"/dev", "/fs/mp", IMAGE_PATH}));
}

const std::string PRODUCT_FILES[] = {
    "/fs/mp/etc/airplay_static.conf",    "/fs/mp/etc/airplay.conf",
    "/fs/mp/etc/iap2_device_static.cfg", "/fs/mp/etc/iap2_device.cfg",
    "/fs/mp/etc/mm/iap2_static.cfg",     "/fs/mp/etc/mm/iap2.cfg",
    "/fs/mp/etc/mm/iap1_static.cfg",     "/fs/mp/etc/mm/iap1.cfg"};

TEST_F(DescribeInputsTest, OnlyTemplatesAndStockFilesAreDescribed) {
    Files expected;
    for (const std::string& path : PRODUCT_FILES) {
        put(path, "content of " + path + std::string("\0\xFF", 2));
        expected[path] = "content of " + path + std::string("\0\xFF", 2);
    }
    put("/fs/mp/etc/other.cfg", "not taken");
    put("/top", "not taken");
    EXPECT_EQ(found().files, expected);
}

TEST_F(DescribeInputsTest, FolderInPlaceOfAnInputIsDescribedAsAFolder) {
    Paths expected = {"/dev/hd0", IMAGE_PATH};
    putFolder("/dev/hd0");
    putFolder(std::string(IMAGE_PATH) + "/below");
    for (const std::string& path : PRODUCT_FILES) {
        putFolder(path);
        expected.push_back(path);
    }
    std::sort(expected.begin(), expected.end());
    const kit::UnitDescription unit = found();
    EXPECT_EQ(unit.folders, expected);
    EXPECT_TRUE(unit.absent.empty());
}

TEST_F(DescribeInputsTest, LinksAreFollowedInsideTheSource) {
    put("/kept", "inside");
    put("/image", std::string(5, 'x'));
    put("/dev/disk0", "disk");
    putLink("/dev/hd0", "/dev/disk0");
    putLink(IMAGE_PATH, "../../../../image");
    putLink("/fs/mp/etc/airplay.conf", "/kept");
    putLink("/fs/mp/etc/iap2_device.cfg", source() / "kept"); // no such path inside
    putLink("/fs/mp/etc/mm/iap1.cfg", "/fs/mp/etc/mm");
    const kit::UnitDescription unit = found();
    EXPECT_EQ(unit.image.size, 5U);
    EXPECT_EQ(unit.disk.size, 4U);
    EXPECT_EQ(unit.files, (Files{{"/fs/mp/etc/airplay.conf", "inside"}}));
    EXPECT_EQ(unit.folders, Paths{"/fs/mp/etc/mm/iap1.cfg"});
}

TEST_F(DescribeInputsTest, OnlyOutputsThatCannotBeWrittenAreDescribed) {
    put("/tmp/airplay.conf", "left by a run");
    putFolder("/tmp/iap2_device.cfg");
    putLink("/tmp/iap2.cfg", "/none/at/all");
    putLink("/tmp/iap1.cfg", "fresh");
    putLink("/tmp/telephony_FFFF.txt", "telephony_FFFF.txt");
    put("/tmp/other", "not taken");
    const kit::UnitDescription unit = found();
    EXPECT_EQ(unit.folders,
              (Paths{"/tmp/iap2.cfg", "/tmp/iap2_device.cfg", "/tmp/telephony_FFFF.txt"}));
    EXPECT_TRUE(unit.files.empty());
}

TEST_F(DescribeInputsTest, OutputFolderThatIsNotAFolderIsAbsent) {
    fs::remove(at("/tmp"));
    EXPECT_EQ(found().absent, (Paths{"/dev/hd0", IMAGE_PATH, "/tmp"}));
    put("/tmp", "no folder");
    EXPECT_EQ(found().absent, (Paths{"/dev/hd0", IMAGE_PATH, "/tmp"}));
    fs::remove(at("/tmp"));
    putLink("/tmp", "nowhere");
    EXPECT_EQ(found().absent, (Paths{"/dev/hd0", IMAGE_PATH, "/tmp"}));
    putFolder("/nowhere/iap1.cfg");
    EXPECT_EQ(found().absent, (Paths{"/dev/hd0", IMAGE_PATH}));
    EXPECT_EQ(found().folders, Paths{"/tmp/iap1.cfg"});
}

TEST_F(DescribeInputsTest, InputThatCannotBeReadIsRefusedByName) {
    kit::describeInputs(source()); // permissions apply to the last user namespace that is entered
    for (const std::string& path :
         {std::string("/fs/mp/etc/airplay.conf"), std::string(IMAGE_PATH), std::string("/dev/hd0"),
          std::string("/fs/rwdata/.Version/a.inf")}) {
        put(path, "x");
        fs::permissions(at(path), fs::perms::none);
        std::string said;
        {
            const EnforcedPermissions permissions;
            said = refusal();
        }
        EXPECT_EQ(said, "cannot read " + path + ": Permission denied");
        fs::remove(at(path));
    }
}

TEST_F(DescribeInputsTest, PlaceWhereARunWaitsIsRefusedByName) {
    for (const std::string& path : {std::string("/fs/mp/etc/airplay.conf"), std::string(IMAGE_PATH),
                                    std::string("/dev/hd0"), std::string("/tmp/iap1.cfg")}) {
        ASSERT_EQ(::mkfifo(at(path).c_str(), 0600), 0);
        EXPECT_EQ(refusal(), path + " is a pipe: a run waits there for its other end");
        fs::remove(at(path));
    }
}

TEST_F(DescribeInputsTest, OutputsThatThisProcessMayNotWriteCanBeOpenedOnAUnit) {
    put("/tmp/iap1.cfg", "left by a run");
    fs::permissions(at("/tmp/iap1.cfg"), fs::perms::none);
    fs::permissions(at("/tmp"), fs::perms::owner_exec);
    kit::describeInputs(source()); // enters a user namespace where it has to
    {
        const EnforcedPermissions permissions;
        EXPECT_TRUE(kit::describeInputs(source()).folders.empty());
    }
    fs::permissions(at("/tmp"), fs::perms::owner_all);
}

TEST_F(DescribeInputsTest, SourceThatIsNotAFolderIsRefused) {
    fs::remove_all(source());
    try {
        kit::describeInputs(source());
        ADD_FAILURE() << "found";
    } catch (const kit::KitError& error) {
        EXPECT_EQ(error.text(), "cannot read " + source().string() + ": No such file or directory");
    }
}

TEST_F(DescribeInputsTest, CurrentRootIsASourceLikeAnyOther) {
    put(IMAGE_PATH, std::string(179, 'i'));
    put("/fs/mp/etc/airplay.conf", "stock");
    const kit::UnitDescription fromOutside = found();
    const kit::EnteredRoot entered(source());
    EXPECT_TRUE(kit::describeInputs("/") == fromOutside);
}

} // namespace

} // namespace orvane::test
