// SPDX-License-Identifier: Apache-2.0
#include "config/config_store.h"
#include "config/param_access.h"
#include "config/record_area.h"
#include "kit/description/unit_description.h"
#include "kit/enter/entered_root.h"
#include "kit/unit/make_unit.h"
#include "tests/kit/host/open_descriptors.h"
#include "tests/support/temporary_folder.h"
#include "tests/support/unit_test.h"

#include <gtest/gtest.h>
#include <sys/stat.h>

#include <cstdint>
#include <filesystem>
#include <set>
#include <string>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;

/// Where the tuning and the auxiliary area begin on a disk of 2 MiB.
constexpr std::size_t TUNING_OFFSET = 0x200000 - 0xFF000;
constexpr std::size_t AUX_OFFSET = 0x200000 - 0xFF400;

/// The slot's content, read inside the unit into a buffer of `length` bytes.
std::string slotContent(std::uint32_t slot, std::uint32_t length) {
    std::string buffer(length, '?');
    EXPECT_EQ(readRecordSlot(slot, buffer.data(), length), 0) << slot;
    return buffer;
}

/// All entries of a unit, files with their size.
std::set<std::string> entriesOf(const fs::path& root) {
    std::set<std::string> entries;
    for (const fs::directory_entry& entry : fs::recursive_directory_iterator(root)) {
        const std::string name = entry.path().lexically_relative(root).string();
        entries.insert(entry.is_directory() ? name
                                            : name + "=" + std::to_string(entry.file_size()));
    }
    return entries;
}

const std::set<std::string> EMPTY_UNIT = {".orvane-unit=30",
                                          "dev",
                                          "dev/hd0=2097152",
                                          "fs",
                                          "fs/mp",
                                          "tmp",
                                          "fs/mp/etc",
                                          "fs/tmpfs",
                                          "fs/mp/etc/mm",
                                          "fs/rwdata",
                                          "fs/rwdata/.Version",
                                          "fs/tmpfs/VS_DIAG_SERVICE_CONFIG_SHARED_MEM=179"};

class MakeUnitTest : public ::testing::Test {
protected:
    fs::path root() const { return folder_.path() / "unit"; }
    fs::path image() const { return root() / "fs/tmpfs/VS_DIAG_SERVICE_CONFIG_SHARED_MEM"; }
    fs::path disk() const { return root() / "dev/hd0"; }

    void make(const kit::UnitDescription& unit) const { kit::makeUnit(unit, root()); }

private:
    TemporaryFolder folder_;
};

TEST_F(MakeUnitTest, EmptyUnitHasItsFoldersAnImageAndADiskOfZeros) {
    make({});
    EXPECT_EQ(entriesOf(root()), EMPTY_UNIT);
    EXPECT_EQ(readFile(image()), std::string(179, '\0'));
    EXPECT_TRUE(readFile(disk()) == std::string(2097152, '\0'));
}

TEST_F(MakeUnitTest, EmptyFolderBecomesAUnit) {
    fs::create_directory(root());
    make({});
    EXPECT_EQ(entriesOf(root()), EMPTY_UNIT);
}

TEST_F(MakeUnitTest, RootMayBeNamedRelativeToTheWorkingDirectory) {
    const fs::path hostCwd = fs::current_path();
    kit::UnitDescription unit;
    unit.disk.slots[9] = "SN004217";
    fs::current_path(root().parent_path());
    EXPECT_NO_THROW(kit::makeUnit(unit, "unit"));
    fs::current_path(hostCwd);
    const kit::EnteredRoot entered(root());
    EXPECT_EQ(slotContent(9, 8), "SN004217");
}

TEST_F(MakeUnitTest, DiskNeedsNoRoomForItsZeros) {
    kit::UnitDescription unit;
    unit.disk.size = 256 * MEBIBYTE;
    unit.disk.slots[9] = "x";
    make(unit);
    EXPECT_EQ(fs::file_size(disk()), 256 * MEBIBYTE);
    struct stat state {};
    ASSERT_EQ(stat(disk().c_str(), &state), 0);
    EXPECT_LT(state.st_blocks * 512, 16 * 1024 * 1024);
}

TEST_F(MakeUnitTest, SlotsAreWhereTheProductReadsThem) {
    const std::set<std::uint32_t> oneByte = {0, 10, 11, 12, 13, 14};
    kit::UnitDescription unit;
    for (std::uint32_t slot = 0; slot < 18; ++slot) {
        if (slot != 15) { // slot 15 covers slots 1 to 9
            unit.disk.slots[slot] =
                std::string(oneByte.count(slot) == 1 ? 1 : 2, static_cast<char>('A' + slot));
        }
    }
    make(unit);
    const kit::EnteredRoot entered(root());
    for (const auto& [slot, bytes] : unit.disk.slots) {
        EXPECT_EQ(slotContent(slot, 24), bytes + std::string(24 - bytes.size(), '\0')) << slot;
    }
    EXPECT_EQ(slotContent(15, 4), std::string("BB\0\0", 4));
}

TEST_F(MakeUnitTest, SlotFifteenIsWrittenAfterTheSlotsThatItCovers) {
    kit::UnitDescription unit;
    unit.disk.slots[9] = "covered";
    unit.disk.slots[15] = std::string(136, 'x');
    make(unit);
    const kit::EnteredRoot entered(root());
    EXPECT_EQ(slotContent(9, 8), "xxxxxxxx");
}

TEST_F(MakeUnitTest, AuxiliaryAreaIsWhereTheProductReadsIt) {
    kit::UnitDescription unit;
    unit.disk.aux = std::string("bench\0two", 9) + std::string(1015, '.');
    make(unit);
    const kit::EnteredRoot entered(root());
    std::string aux(1024, '?');
    ASSERT_EQ(readAuxArea(aux.data(), 1024), 0);
    EXPECT_EQ(aux, *unit.disk.aux);
}

TEST_F(MakeUnitTest, TuningBlocksAreWhereTheProductReadsThem) {
    kit::UnitDescription unit;
    unit.disk.tuning[0].raw = "first";
    unit.disk.tuning[3].fields = {{"qwaNRAtten", std::int64_t{-12}}, {"qwaAECSwitch", "qwaOn"}};
    unit.disk.tuning[9].raw = std::string(188, 'z');
    make(unit);
    const kit::EnteredRoot entered(root());
    std::string area(1881, '?');
    ASSERT_EQ(readTuningArea(area.data(), 1881), 0);
    std::string expected = "first" + std::string(1687, '\0') + std::string(188, 'z') + '\0';
    constexpr std::size_t BLOCK_3 = 564; // 3 * 188
    expected[BLOCK_3] = 2;               // on
    expected[BLOCK_3 + 23] = '\xF4';     // -12
    expected[BLOCK_3 + 24] = '\xFF';
    EXPECT_EQ(area, expected);
}

TEST_F(MakeUnitTest, RecordsFitOnADiskOfOneMebibyte) {
    kit::UnitDescription unit;
    unit.disk.size = MEBIBYTE;
    unit.disk.slots[0] = "b";
    unit.disk.aux = "aux";
    unit.disk.tuning[0].raw = "raw";
    make(unit);
    EXPECT_EQ(readFile(disk()).substr(0, 1), "b");
    EXPECT_EQ(readFile(disk()).substr(3072, 4), std::string("aux\0", 4));
    EXPECT_EQ(readFile(disk()).substr(4096, 4), std::string("raw\0", 4));
}

TEST_F(MakeUnitTest, RawBytesOfTheDiskAreWrittenLast) {
    kit::UnitDescription unit;
    unit.disk.tuning[0].raw = "tuning";
    unit.disk.aux = "auxiliary";
    unit.disk.bytes = {{0, "boot"}, {AUX_OFFSET + 1, "-"}, {TUNING_OFFSET, "raw"}, {0x1FFFFF, "."}};
    make(unit);
    const std::string bytes = readFile(disk());
    EXPECT_EQ(bytes.size(), 0x200000U);
    EXPECT_EQ(bytes.substr(0, 5), std::string("boot\0", 5));
    EXPECT_EQ(bytes.substr(AUX_OFFSET, 10), std::string("a-xiliary\0", 10));
    EXPECT_EQ(bytes.substr(TUNING_OFFSET, 7), std::string("rawing\0", 7));
    EXPECT_EQ(bytes.back(), '.');
}

TEST_F(MakeUnitTest, ParametersAreWhereTheProductReadsThem) {
    kit::UnitDescription unit;
    unit.image.params = {{1, 7}, {22, 255}, {134, 0xABCD}, {171, 9}};
    make(unit);
    const kit::EnteredRoot entered(root());
    ConfigStore store;
    ASSERT_EQ(store.open(), 0);
    std::uint16_t wide = 0;
    EXPECT_EQ(getParamU16(store, 134, &wide), PARAM_OK);
    EXPECT_EQ(wide, 0xABCD);
    for (const std::uint16_t number : {std::uint16_t{1}, std::uint16_t{22}, std::uint16_t{171}}) {
        std::uint8_t narrow = 0;
        EXPECT_EQ(getParamU8(store, number, &narrow), PARAM_OK) << number;
        EXPECT_EQ(narrow, unit.image.params.at(number)) << number;
    }
}

TEST_F(MakeUnitTest, BytesOfTheImageComeAfterItsParameters) {
    kit::UnitDescription unit;
    unit.image.params = {{134, 0xABCD}, {22, 5}};
    unit.image.bytes = {{134, "\x11"}, {178, "\x22"}};
    make(unit);
    std::string expected(179, '\0');
    expected[21] = 5;
    expected[133] = '\xCD';
    expected[134] = '\x11';
    expected[178] = '\x22';
    EXPECT_EQ(readFile(image()), expected);
}

TEST_F(MakeUnitTest, ImageMayBeOfAnySize) {
    for (const std::uint32_t size : {0U, 1U, 178U, 5000U}) {
        kit::UnitDescription unit;
        unit.image.size = size;
        make(unit);
        EXPECT_EQ(readFile(image()), std::string(size, '\0'));
        fs::remove_all(root());
    }
}

TEST_F(MakeUnitTest, FilesAreMadeWithTheirFoldersAndAnyBytes) {
    const std::string bytes("a\0\xFF\r\n", 5);
    kit::UnitDescription unit;
    unit.files = {{"/new/deep/file", bytes}, {"/tmp/iap1.cfg", ""}};
    unit.folders = {"/tmp/airplay.conf", "/other/deep"};
    make(unit);
    EXPECT_EQ(readFile(root() / "new/deep/file"), bytes);
    EXPECT_EQ(readFile(root() / "tmp/iap1.cfg"), "");
    EXPECT_TRUE(fs::is_directory(root() / "tmp/airplay.conf"));
    EXPECT_TRUE(fs::is_directory(root() / "other/deep"));
}

TEST_F(MakeUnitTest, FileOrFolderReplacesImageAndDisk) {
    kit::UnitDescription unit;
    unit.disk.slots[9] = "unused";
    unit.files["/dev/hd0"] = "no disk";
    unit.folders = {IMAGE_PATH};
    make(unit);
    EXPECT_EQ(readFile(disk()), "no disk");
    EXPECT_TRUE(fs::is_directory(image()));
}

TEST_F(MakeUnitTest, AbsentPathsAreGoneWithAllBelowThem) {
    kit::UnitDescription unit;
    unit.disk.slots[9] = "unused";
    unit.files = {{"/fs/mp/etc/mm/iap2.cfg", "x"}, {"/tmp/gone", "x"}, {"/tmp/kept", "x"}};
    unit.absent = {"/dev", "/fs/mp/etc", "/tmp/gone", "/never/there", IMAGE_PATH};
    make(unit);
    EXPECT_EQ(entriesOf(root()),
              (std::set<std::string>{".orvane-unit=30", "fs", "fs/mp", "fs/rwdata",
                                     "fs/rwdata/.Version", "fs/tmpfs", "tmp", "tmp/kept=1"}));
}

TEST_F(MakeUnitTest, AbsentNameIsNotMatchedAsAPrefix) {
    kit::UnitDescription unit;
    unit.absent = {"/de", "/dev/hd", "/dev/hd0.old"};
    make(unit);
    EXPECT_EQ(entriesOf(root()), EMPTY_UNIT);
}

TEST_F(MakeUnitTest, RootFolderAndDescriptorsAreAsBefore) {
    const std::size_t before = openDescriptors();
    const fs::path hostCwd = fs::current_path();
    kit::UnitDescription unit;
    unit.disk.slots[9] = "SN004217";
    unit.files["/tmp/file"] = "x";
    make(unit);
    EXPECT_EQ(openDescriptors(), before);
    EXPECT_EQ(fs::current_path(), hostCwd);
    EXPECT_TRUE(fs::exists(disk()));
}

} // namespace

} // namespace orvane::test
