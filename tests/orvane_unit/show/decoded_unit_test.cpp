// SPDX-License-Identifier: Apache-2.0
#include "config/boot_disk.h"
#include "config/config_store.h"
#include "kit/host/sparse_content.h"
#include "orvane_unit/show/decoded_unit.h"
#include "tests/kit/unit/described_unit.h"
#include "tests/support/unit_test.h"

namespace orvane::test {

namespace {

using desk::CrcVerdict;
using desk::DecodedUnit;
using kit::UnitDescription;

TEST(DecodedUnitTest, ParametersAreDecoded) {
    const DescribedUnit described([](UnitDescription& unit) {
        unit.image.params[134] = 0xFFFF;
        unit.image.params[171] = 255;
        unit.image.params[50] = 2;
    });
    const DecodedUnit unit = desk::decodeUnit(described.root());
    ASSERT_EQ(unit.image.params.size(), 171U);
    const desk::DecodedParam& model = unit.image.params[138];
    EXPECT_EQ(model.row.number, 139U);
    EXPECT_EQ(model.row.offset, 139U);
    EXPECT_EQ(model.size, 1U);
    EXPECT_EQ(model.raw, 26);
    EXPECT_EQ(model.meaning, "model Quarion Velmira");
    EXPECT_EQ(unit.image.params[133].raw, 0xFFFF);
    EXPECT_EQ(unit.image.params[133].meaning,
              "audio profile 65535, generated from tuning blocks 3 and 2");
    EXPECT_EQ(unit.image.params[21].meaning, "right-hand drive 1");
    EXPECT_EQ(unit.image.params[35].meaning, "brand QUARION");
    EXPECT_EQ(unit.image.params[49].meaning, "fuel type cng, which is not written");
    EXPECT_EQ(unit.image.params[170].raw, 255);
    EXPECT_EQ(unit.image.params[0].meaning, "");
}

TEST(DecodedUnitTest, ParametersPastTheImageHaveNoValue) {
    const DescribedUnit described([](UnitDescription& unit) {
        unit.image = {};
        unit.image.size = 134;
    });
    const DecodedUnit unit = desk::decodeUnit(described.root());
    EXPECT_EQ(unit.image.params[132].raw, 0); // 133, at byte 132
    EXPECT_EQ(unit.image.params[133].raw, std::nullopt);
    EXPECT_EQ(unit.image.params[138].raw, std::nullopt);
}

TEST(DecodedUnitTest, MissingImageAndDiskAreReported) {
    const DescribedUnit described([](UnitDescription& unit) {
        unit.absent = {CONFIG_SHM_NAME, BOOT_DISK};
    });
    const DecodedUnit unit = desk::decodeUnit(described.root());
    EXPECT_EQ(unit.image.found.reason, desk::Reason::imageMissing);
    EXPECT_EQ(unit.image.params[138].raw, std::nullopt);
    EXPECT_EQ(unit.image.params[138].meaning, "model VOXA");
    EXPECT_EQ(unit.records.diskTrouble, desk::Reason::diskMissing);
    EXPECT_EQ(unit.records.slots[9].bytes, std::nullopt);
    EXPECT_EQ(unit.records.aux, std::nullopt);
    EXPECT_EQ(unit.records.crcVerdict, CrcVerdict::unreadable);
    EXPECT_EQ(unit.records.crc, 0xFFFFFFFFU);
    EXPECT_EQ(unit.tuning.reason, desk::Reason::diskMissing);
}

TEST(DecodedUnitTest, RecordsAreRead) {
    const DescribedUnit described([](UnitDescription& unit) {
        unit.disk.slots[17] = std::string("\x2a\x00", 2);
        unit.disk.aux = "bench 2";
    });
    const DecodedUnit unit = desk::decodeUnit(described.root());
    ASSERT_EQ(unit.records.slots.size(), 18U);
    EXPECT_EQ(unit.records.slots[9].bytes, "SN004217");
    EXPECT_EQ(unit.records.slots[9].offset, 129U);
    EXPECT_EQ(unit.records.slots[17].bytes, std::string("\x2a\x00", 2));
    EXPECT_EQ(unit.records.slots[15].bytes->substr(128), "SN004217");
    EXPECT_EQ(kit::withoutTrailingZeros(*unit.records.aux), "bench 2");
    EXPECT_EQ(unit.records.diskSize, 2U * 1024 * 1024);
    EXPECT_EQ(unit.records.crcVerdict, CrcVerdict::computed);
}

TEST(DecodedUnitTest, BlankRecordsHaveABlankCrc) {
    const DescribedUnit described([](UnitDescription& unit) { unit.disk.slots.clear(); });
    const DecodedUnit unit = desk::decodeUnit(described.root());
    EXPECT_EQ(unit.records.crcVerdict, CrcVerdict::blank);
    // The complement of zlib's CRC-32 of 136 zero bytes.
    EXPECT_EQ(~unit.records.crc, 0x773333E6U);
}

TEST(DecodedUnitTest, CrcCoversSlots1To9) {
    // The complement of zlib's CRC-32 of 128 zero bytes and the serial.
    EXPECT_EQ(desk::decodeUnit(DescribedUnit().root()).records.crc, 0xC44C7586U);
}

TEST(DecodedUnitTest, CrcOfAllOnesIsAmbiguous) {
    const DescribedUnit described([](UnitDescription& unit) {
        // zlib's CRC-32 of 128 zero bytes and these is 0.
        unit.disk.slots[9] = "SN00\x5a\x89\x73\xf2";
    });
    const DecodedUnit unit = desk::decodeUnit(described.root());
    EXPECT_EQ(unit.records.crc, 0xFFFFFFFFU);
    EXPECT_EQ(unit.records.crcVerdict, CrcVerdict::ambiguous);
}

TEST(DecodedUnitTest, DiskThatIsTooShortIsReported) {
    const DescribedUnit described([](UnitDescription& unit) {
        unit.disk = {};
        unit.disk.size = MEBIBYTE - 1;
    });
    const DecodedUnit unit = desk::decodeUnit(described.root());
    EXPECT_EQ(unit.records.diskSize, 1'048'575U);
    EXPECT_EQ(unit.records.diskTrouble, desk::Reason::diskTooShort);
    EXPECT_EQ(unit.records.slots[0].bytes, std::nullopt);
    // Slot 1 begins one byte after the base, so it and all others are there.
    EXPECT_EQ(unit.records.slots[1].bytes, std::string(16, '\0'));
    EXPECT_EQ(unit.records.crcVerdict, CrcVerdict::blank);
    EXPECT_EQ(unit.tuning.reason, desk::Reason::fromTuningBlock);
}

TEST(DecodedUnitTest, OfTwoApplicationsOnlyOneIsChosen) {
    const DescribedUnit described([](UnitDescription& unit) {
        unit.files["/fs/rwdata/.Version/other.inf"] = "Type=xApplicationx\nVersion Number=7.8.9\n";
    });
    const DecodedUnit unit = desk::decodeUnit(described.root());
    ASSERT_EQ(unit.versions.found.files.size(), 2U);
    // The file system decides which one is first.
    EXPECT_EQ(unit.versions.found.chosen, 0U);
    const bool isOther = unit.versions.found.files[0].path == "/fs/rwdata/.Version/other.inf";
    EXPECT_EQ(unit.versions.version, isOther ? "7.8.9" : "3.10.2_rc");
    EXPECT_EQ(unit.versions.digits, isOther ? "070809" : "030a02");
}

TEST(DecodedUnitTest, MissingVersionFolderIsReported) {
    const DescribedUnit described([](UnitDescription& unit) {
        unit.files.erase("/fs/rwdata/.Version/app.inf");
        unit.absent = {"/fs/rwdata/.Version"};
    });
    const DecodedUnit unit = desk::decodeUnit(described.root());
    EXPECT_FALSE(unit.versions.found.hasFolder);
    EXPECT_FALSE(unit.versions.found.chosen);
}

TEST(DecodedUnitTest, VersionFilesAreChosenOrNot) {
    const DescribedUnit described([](UnitDescription& unit) {
        unit.files["/fs/rwdata/.Version/map.inf"] = "Type=Map\nVersion Number=9\n";
        unit.files["/fs/rwdata/.Version/readme.txt"] = "Type=Application\n";
    });
    const DecodedUnit unit = desk::decodeUnit(described.root());
    EXPECT_EQ(unit.versions.found.files.size(), 2U);
    ASSERT_TRUE(unit.versions.found.chosen);
    EXPECT_EQ(unit.versions.found.files[*unit.versions.found.chosen].path,
              "/fs/rwdata/.Version/app.inf");
    EXPECT_EQ(unit.versions.version, "3.10.2_rc");
    EXPECT_EQ(unit.versions.digits, "030a02");
}

TEST(DecodedUnitTest, FilesShowTheirKind) {
    const DescribedUnit described([](UnitDescription& unit) {
        unit.folders.push_back("/tmp/airplay.conf");
        unit.files.erase("/fs/mp/etc/mm/iap1.cfg");
    });
    for (const desk::UnitFile& file : desk::decodeUnit(described.root()).files) {
        if (file.path == "/tmp/airplay.conf") {
            EXPECT_EQ(file.kind, desk::PathKind::folder);
        } else if (file.path == "/fs/mp/etc/mm/iap1.cfg") {
            EXPECT_EQ(file.kind, desk::PathKind::nothing);
        } else if (file.path == "/fs/mp/etc/airplay.conf") {
            EXPECT_EQ(file.kind, desk::PathKind::file);
            EXPECT_EQ(file.size, 14U);
            EXPECT_EQ(file.role, "stock file");
        }
    }
}

} // namespace

} // namespace orvane::test
