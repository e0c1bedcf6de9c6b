// SPDX-License-Identifier: Apache-2.0
#include "config/boot_disk.h"
#include "config/config_store.h"
#include "kit/host/sparse_content.h"
#include "orvane_unit/report/decoded_unit_text.h"
#include "orvane_unit/show/decoded_unit.h"
#include "tests/orvane_unit/explain/described_unit.h"
#include "tests/support/unit_test.h"

#include <iterator>
#include <sstream>

namespace orvane::test {

namespace {

using desk::Contents;
using desk::CrcVerdict;
using kit::UnitDescription;

std::string printed(const Contents& contents, const std::string& only) {
    std::ostringstream out;
    desk::printContents(out, contents, only);
    return out.str();
}

TEST(ContentsTest, ParametersAreDecoded) {
    const DescribedUnit described([](UnitDescription& unit) {
        unit.image.params[134] = 0xFFFF;
        unit.image.params[171] = 255;
        unit.image.params[50] = 2;
    });
    const Contents contents = desk::readContents(described.root());
    ASSERT_EQ(contents.params.size(), 171U);
    const desk::Param& model = contents.params[138];
    EXPECT_EQ(model.row.number, 139U);
    EXPECT_EQ(model.row.offset, 139U);
    EXPECT_EQ(model.size, 1U);
    EXPECT_EQ(model.raw, 26);
    EXPECT_EQ(model.meaning, "model Quarion Velmira");
    EXPECT_EQ(contents.params[133].raw, 0xFFFF);
    EXPECT_EQ(contents.params[133].meaning,
              "audio profile 65535, generated from tuning blocks 3 and 2");
    EXPECT_EQ(contents.params[21].meaning, "rightHandDrive 1");
    EXPECT_EQ(contents.params[35].meaning, "brand QUARION");
    EXPECT_EQ(contents.params[49].meaning, "fuel type cng, which is written nowhere");
    EXPECT_EQ(contents.params[170].raw, 255);
    EXPECT_EQ(contents.params[0].meaning, "");
    EXPECT_NE(printed(contents, "params")
                  .find("  134     3    133    2  65535 0xffff       0 0xffffffff   46  audio"),
              std::string::npos);
}

TEST(ContentsTest, ParametersPastTheImageHaveNoValue) {
    const DescribedUnit described([](UnitDescription& unit) {
        unit.image = {};
        unit.image.size = 134;
    });
    const Contents contents = desk::readContents(described.root());
    EXPECT_EQ(contents.params[132].raw, 0); // 133, at byte 132
    EXPECT_EQ(contents.params[133].raw, std::nullopt);
    EXPECT_EQ(contents.params[138].raw, std::nullopt);
}

TEST(ContentsTest, MissingImageAndDiskAreTold) {
    const DescribedUnit described([](UnitDescription& unit) {
        unit.absent = {CONFIG_SHM_NAME, BOOT_DISK};
    });
    const Contents contents = desk::readContents(described.root());
    EXPECT_EQ(contents.image.reason, desk::Reason::imageMissing);
    EXPECT_EQ(contents.params[138].raw, std::nullopt);
    EXPECT_EQ(contents.params[138].meaning, "model VOXA");
    EXPECT_EQ(contents.diskTrouble, desk::Reason::diskMissing);
    EXPECT_EQ(contents.slots[9].bytes, std::nullopt);
    EXPECT_EQ(contents.aux, std::nullopt);
    EXPECT_EQ(contents.crcVerdict, CrcVerdict::unreadable);
    EXPECT_EQ(contents.crc, 0xFFFFFFFFU);
    EXPECT_EQ(contents.tuning.reason, desk::Reason::diskMissing);
}

TEST(ContentsTest, RecordsAreRead) {
    const DescribedUnit described([](UnitDescription& unit) {
        unit.disk.slots[17] = std::string("\x2a\x00", 2);
        unit.disk.aux = "bench 2";
    });
    const Contents contents = desk::readContents(described.root());
    ASSERT_EQ(contents.slots.size(), 18U);
    EXPECT_EQ(contents.slots[9].bytes, "SN004217");
    EXPECT_EQ(contents.slots[9].offset, 129U);
    EXPECT_EQ(contents.slots[17].bytes, std::string("\x2a\x00", 2));
    EXPECT_EQ(contents.slots[15].bytes->substr(128), "SN004217");
    EXPECT_EQ(kit::withoutEndZeros(*contents.aux), "bench 2");
    EXPECT_EQ(contents.diskSize, 2U * 1024 * 1024);
    EXPECT_EQ(contents.crcVerdict, CrcVerdict::computed);
    EXPECT_NE(printed(contents, "records").find("   9    129    8  \"SN004217\"\n"),
              std::string::npos);
}

TEST(ContentsTest, BlankRecordsHaveABlankCrc) {
    const DescribedUnit described([](UnitDescription& unit) { unit.disk.slots.clear(); });
    const Contents contents = desk::readContents(described.root());
    EXPECT_EQ(contents.crcVerdict, CrcVerdict::blank);
    // The complement of the usual CRC-32 of 136 zero bytes; that value by zlib.
    EXPECT_EQ(~contents.crc, 0x773333E6U);
}

TEST(ContentsTest, CrcIsThatOfSlots1To9) {
    // The complement of zlib's CRC-32 of 128 zero bytes and the serial.
    EXPECT_EQ(desk::readContents(DescribedUnit().root()).crc, 0xC44C7586U);
}

TEST(ContentsTest, CrcOfAllOnesIsAmbiguous) {
    const DescribedUnit described([](UnitDescription& unit) {
        // Of 128 zero bytes and these, zlib's CRC-32 is 0.
        unit.disk.slots[9] = "SN00\x5a\x89\x73\xf2";
    });
    const Contents contents = desk::readContents(described.root());
    EXPECT_EQ(contents.crc, 0xFFFFFFFFU);
    EXPECT_EQ(contents.crcVerdict, CrcVerdict::ambiguous);
    EXPECT_NE(printed(contents, "records").find("CRC over slots 1 to 9: 0xffffffff, ambiguous\n"),
              std::string::npos);
}

TEST(ContentsTest, DiskThatIsTooShortIsTold) {
    const DescribedUnit described([](UnitDescription& unit) {
        unit.disk = {};
        unit.disk.size = MEBIBYTE - 1;
    });
    const Contents contents = desk::readContents(described.root());
    EXPECT_EQ(contents.diskSize, 1'048'575U);
    EXPECT_EQ(contents.diskTrouble, desk::Reason::diskTooShort);
    EXPECT_EQ(contents.slots[0].bytes, std::nullopt);
    // Slot 1 begins one byte behind the base, so it and all others are there.
    EXPECT_EQ(contents.slots[1].bytes, std::string(16, '\0'));
    EXPECT_EQ(contents.crcVerdict, CrcVerdict::blank);
    EXPECT_EQ(contents.tuning.reason, desk::Reason::fromTuningBlock);
}

TEST(ContentsTest, EachPartCanBePrintedAlone) {
    const Contents contents = desk::readContents(DescribedUnit().root());
    const std::string beginnings[] = {
        "image: 179 bytes\n", "disk: 2097152 bytes\n", "tuning block 0",
        "/fs/rwdata/.Version/app.inf: ", "/fs/tmpfs/VS_DIAG_SERVICE_CONFIG_SHARED_MEM "};
    std::string all;
    std::size_t part = 0;
    for (const char* name : desk::CONTENT_PARTS) {
        const std::string text = printed(contents, name);
        EXPECT_EQ(text.compare(0, beginnings[part].size(), beginnings[part]), 0) << text;
        all += text;
        ++part;
    }
    EXPECT_EQ(part, std::size(beginnings));
    EXPECT_EQ(printed(contents, ""), all);
}

TEST(ContentsTest, OfTwoApplicationsOnlyOneIsChosen) {
    const DescribedUnit described([](UnitDescription& unit) {
        unit.files["/fs/rwdata/.Version/other.inf"] = "Type=xApplicationx\nVersion Number=7.8.9\n";
    });
    const Contents contents = desk::readContents(described.root());
    ASSERT_EQ(contents.versions.files.size(), 2U);
    // Which one is the first is the file system's business.
    EXPECT_EQ(contents.versions.chosen, 0U);
    const bool isOther = contents.versions.files[0].path == "/fs/rwdata/.Version/other.inf";
    EXPECT_EQ(contents.version, isOther ? "7.8.9" : "3.10.2_rc");
    EXPECT_EQ(contents.versionDigits, isOther ? "070809" : "030a02");
    EXPECT_NE(printed(contents, "versions")
                  .find(std::string(isOther ? "app" : "other") +
                        ".inf: not chosen: an application, but not the first one\n"),
              std::string::npos);
}

TEST(ContentsTest, MissingVersionFolderIsTold) {
    const DescribedUnit described([](UnitDescription& unit) {
        unit.files.erase("/fs/rwdata/.Version/app.inf");
        unit.absent = {"/fs/rwdata/.Version"};
    });
    const Contents contents = desk::readContents(described.root());
    EXPECT_FALSE(contents.versions.hasFolder);
    EXPECT_FALSE(contents.versions.chosen);
    EXPECT_EQ(printed(contents, "versions"),
              "the folder of the version description files can't be read\n"
              "version: \"" +
                  contents.version + "\", as digits " + contents.versionDigits + "\n");
}

TEST(ContentsTest, VersionFilesAreChosenOrNot) {
    const DescribedUnit described([](UnitDescription& unit) {
        unit.files["/fs/rwdata/.Version/map.inf"] = "Type=Map\nVersion Number=9\n";
        unit.files["/fs/rwdata/.Version/readme.txt"] = "Type=Application\n";
    });
    const Contents contents = desk::readContents(described.root());
    EXPECT_EQ(contents.versions.files.size(), 2U);
    ASSERT_TRUE(contents.versions.chosen);
    EXPECT_EQ(contents.versions.files[*contents.versions.chosen].path,
              "/fs/rwdata/.Version/app.inf");
    EXPECT_EQ(contents.version, "3.10.2_rc");
    EXPECT_EQ(contents.versionDigits, "030a02");
    const std::string text = printed(contents, "versions");
    EXPECT_NE(text.find("map.inf: not chosen: its type has no \"Application\" in it"),
              std::string::npos);
    EXPECT_NE(text.find("app.inf: chosen: the first application"), std::string::npos);
}

TEST(ContentsTest, TuningBlocksShowTheirWords) {
    const DescribedUnit described([](UnitDescription& unit) {
        unit.disk.tuning[3].fields["qwaAECSwitch"] = std::string("qwaOn");
        unit.disk.tuning[3].fields["qwaNCParams"] = std::vector<std::int64_t>{1, -2, 3, 0, 5};
    });
    const std::string text = printed(desk::readContents(described.root()), "tuning");
    EXPECT_NE(text.find("tuning block 3, telephony\n  qwaAECSwitch            2  qwaOn\n"),
              std::string::npos);
    EXPECT_NE(text.find("  qwaNCParams             1, -2, 3, 0, 5\n"), std::string::npos);
    EXPECT_NE(text.find("  qwaAGCSwitch            0  no word\n"), std::string::npos);
    EXPECT_NE(text.find("tuning block 0: zeros\n"), std::string::npos);
}

TEST(ContentsTest, FilesTellTheirKind) {
    const DescribedUnit described([](UnitDescription& unit) {
        unit.folders.push_back("/tmp/airplay.conf");
        unit.files.erase("/fs/mp/etc/mm/iap1.cfg");
    });
    for (const desk::UnitFile& file : desk::readContents(described.root()).files) {
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
