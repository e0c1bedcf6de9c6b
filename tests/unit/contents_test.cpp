// SPDX-License-Identifier: Apache-2.0
#include "config/boot_disk.h"
#include "config/config_store.h"
#include "kit/non_zero_runs.h"
#include "tests/unit/described_unit.h"
#include "unit/contents.h"
#include "unit/contents_text.h"

#include <gtest/gtest.h>

#include <sstream>

namespace orvane::test {

namespace {

using kit::UnitDescription;
using unit::Contents;
using unit::CrcVerdict;

std::string printed(const Contents& contents, const std::string& only) {
    std::ostringstream out;
    unit::printContents(out, contents, only);
    return out.str();
}

TEST(ContentsTest, ParametersAreDecoded) {
    const DescribedUnit described([](UnitDescription& unit) {
        unit.image.params[134] = 0xFFFF;
        unit.image.params[171] = 255;
        unit.image.params[50] = 2;
    });
    const Contents contents = unit::readContents(described.root());
    ASSERT_EQ(contents.params.size(), 171U);
    const unit::Param& model = contents.params[138];
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
    const Contents contents = unit::readContents(described.root());
    EXPECT_EQ(contents.params[132].raw, 0); // 133, at byte 132
    EXPECT_EQ(contents.params[133].raw, std::nullopt);
    EXPECT_EQ(contents.params[138].raw, std::nullopt);
}

TEST(ContentsTest, MissingImageAndDiskAreTold) {
    const DescribedUnit described([](UnitDescription& unit) {
        unit.absent = {CONFIG_SHM_NAME, BOOT_DISK};
    });
    const Contents contents = unit::readContents(described.root());
    EXPECT_EQ(contents.image.reason, unit::Reason::imageMissing);
    EXPECT_EQ(contents.params[138].raw, std::nullopt);
    EXPECT_EQ(contents.params[138].meaning, "model VOXA");
    EXPECT_EQ(contents.diskTrouble, unit::Reason::diskMissing);
    EXPECT_EQ(contents.slots[9].bytes, std::nullopt);
    EXPECT_EQ(contents.aux, std::nullopt);
    EXPECT_EQ(contents.crcVerdict, CrcVerdict::unreadable);
    EXPECT_EQ(contents.crc, 0xFFFFFFFFU);
    EXPECT_EQ(contents.tuning.reason, unit::Reason::diskMissing);
}

TEST(ContentsTest, RecordsAreRead) {
    const DescribedUnit described([](UnitDescription& unit) {
        unit.disk.slots[17] = std::string("\x2a\x00", 2);
        unit.disk.aux = "bench 2";
    });
    const Contents contents = unit::readContents(described.root());
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
    const Contents contents = unit::readContents(described.root());
    EXPECT_EQ(contents.crcVerdict, CrcVerdict::blank);
    // The complement of the usual CRC-32 of 136 zero bytes; that value by zlib.
    EXPECT_EQ(~contents.crc, 0x773333E6U);
}

TEST(ContentsTest, VersionFilesAreChosenOrNot) {
    const DescribedUnit described([](UnitDescription& unit) {
        unit.files["/fs/rwdata/.Version/map.inf"] = "Type=Map\nVersion Number=9\n";
        unit.files["/fs/rwdata/.Version/readme.txt"] = "Type=Application\n";
    });
    const Contents contents = unit::readContents(described.root());
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
    const std::string text = printed(unit::readContents(described.root()), "tuning");
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
    for (const unit::UnitFile& file : unit::readContents(described.root()).files) {
        if (file.path == "/tmp/airplay.conf") {
            EXPECT_EQ(file.kind, unit::Left::folder);
        } else if (file.path == "/fs/mp/etc/mm/iap1.cfg") {
            EXPECT_EQ(file.kind, unit::Left::nothing);
        } else if (file.path == "/fs/mp/etc/airplay.conf") {
            EXPECT_EQ(file.kind, unit::Left::file);
            EXPECT_EQ(file.size, 14U);
            EXPECT_EQ(file.role, "stock file");
        }
    }
}

} // namespace

} // namespace orvane::test
