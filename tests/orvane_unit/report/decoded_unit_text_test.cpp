// SPDX-License-Identifier: Apache-2.0
#include "kit/description/value_places.h"
#include "orvane_unit/report/decoded_unit_text.h"

#include <gtest/gtest.h>

#include <sstream>

namespace orvane::test {

namespace {

using desk::CrcVerdict;
using desk::DecodedUnit;
using desk::PathKind;
using desk::Reason;

std::string printed(const DecodedUnit& unit, const std::string& only) {
    std::ostringstream out;
    desk::printDecodedUnit(out, unit, only);
    return out.str();
}

TEST(DecodedUnitTextTest, ParametersAreATable) {
    DecodedUnit unit;
    unit.image.found.size = 179;
    unit.image.params = {{kit::paramRow(1), 4, 1, 0, ""},
                         {kit::paramRow(134), 46, 2, 0xFFFF, "audio\tprofile"},
                         {kit::paramRow(139), 49, 1, std::nullopt, "model VOXA"}};
    EXPECT_EQ(printed(unit, "params"),
              "image: 179 bytes\n"
              "param group offset size    raw    hex default       mask code\n"
              "    1     0      0    1      0   0x00       0 0xffffffff    4\n"
              "  134     3    133    2  65535 0xffff       0 0xffffffff   46  audio\\x09profile\n"
              "  139     3    139    1      -      -       0 0x7ffffffe   49  model VOXA\n");
}

TEST(DecodedUnitTextTest, MissingImageIsReported) {
    DecodedUnit unit;
    unit.image.found.reason = Reason::imageMissing;
    EXPECT_EQ(printed(unit, "params"),
              "image: 0 bytes, the configuration image can't be opened\n"
              "param group offset size    raw    hex default       mask code\n");
}

TEST(DecodedUnitTextTest, RecordsAreATableAndTheCrc) {
    DecodedUnit unit;
    unit.records.diskSize = 1;
    unit.records.slots = {{0, 1, 0, std::string(1, '\0')},
                          {9, 8, 129, std::string("SN\x01\0\0\0\0\0", 8)},
                          {15, 136, 1, std::string(136, 'x')},
                          {17, 2, 2214, std::nullopt}};
    unit.records.aux = "bench 2";
    unit.records.crc = 0xABCD;
    unit.records.crcVerdict = CrcVerdict::computed;
    EXPECT_EQ(printed(unit, "records"), "disk: 1 byte\n"
                                        "slot offset size  content\n"
                                        "   0      0    1  zeros\n"
                                        "   9    129    8  \"SN\\x01\"  53 4e 01\n"
                                        "  15      1  136  repeats slots 1 to 9\n"
                                        "  17   2214    2  -\n"
                                        "auxiliary area: \"bench 2\"\n"
                                        "CRC over slots 1 to 9: 0x0000abcd, computed\n");
}

TEST(DecodedUnitTextTest, DiskThatCannotBeReadIsReported) {
    DecodedUnit unit;
    unit.records.diskTrouble = Reason::diskMissing;
    unit.records.crc = 0xFFFFFFFF;
    unit.tuning.reason = Reason::diskMissing;
    EXPECT_EQ(printed(unit, "records"), "disk: 0 bytes, the boot disk can't be opened\n"
                                        "slot offset size  content\n"
                                        "auxiliary area: -\n"
                                        "CRC over slots 1 to 9: 0xffffffff, unreadable\n");
    EXPECT_EQ(printed(unit, "tuning"), "tuning blocks: the boot disk can't be opened\n");
}

TEST(DecodedUnitTextTest, TuningBlocksShowTheirWords) {
    DecodedUnit unit;
    unit.tuning.blocks[3].bytes[0] = 0x02; // qwaAECSwitch
    unit.tuning.blocks[3].bytes[187] = 0x01;
    const std::string text = printed(unit, "tuning");
    EXPECT_EQ(text.compare(0, 22, "tuning block 0: zeros\n"), 0) << text;
    EXPECT_NE(text.find("tuning block 2, speech recognition: zeros\n"
                        "tuning block 3, telephony\n"
                        "  qwaAECSwitch            2  qwaOn\n"),
              std::string::npos)
        << text;
    EXPECT_NE(text.find("  qwaAGCSwitch            0  no word\n"), std::string::npos);
    EXPECT_NE(text.find("  qwaNCParams             0, 0, 0, 0, 0\n"), std::string::npos);
}

TEST(DecodedUnitTextTest, VersionFilesSayWhetherTheyWereChosen) {
    DecodedUnit unit;
    unit.versions.found = {
        true,
        {{"/v/map.inf", {{"Type", "Map"}}, false},
         {"/v/app.inf", {{"Type", "Application"}, {"Version Number", "1"}}, true},
         {"/v/more\n.inf", {}, true}},
        1};
    unit.versions.version = "1";
    unit.versions.digits = "010101";
    EXPECT_EQ(printed(unit, "versions"),
              "/v/map.inf: not chosen: its type does not contain \"Application\"\n"
              "  Type = Map\n"
              "/v/app.inf: chosen: the first application in the order of the listing\n"
              "  Type = Application\n"
              "  Version Number = 1\n"
              "/v/more\\n.inf: not chosen: an application, but not the first one\n"
              "version: \"1\", as digits 010101\n");
}

TEST(DecodedUnitTextTest, MissingVersionFolderIsReported) {
    DecodedUnit unit;
    unit.versions.digits = "000000";
    EXPECT_EQ(printed(unit, "versions"),
              "the folder of the version description files can't be read\n"
              "version: \"\", as digits 000000\n");
}

TEST(DecodedUnitTextTest, FilesShowTheirKind) {
    DecodedUnit unit;
    unit.files = {{"/tmp/a", "output", PathKind::nothing, 0},
                  {"/tmp/b", "output", PathKind::folder, 0},
                  {"/dev/hd0", "boot disk", PathKind::other, 0},
                  {"/" + std::string(60, 'x'), "template", PathKind::file, 1}};
    EXPECT_EQ(printed(unit, "files"),
              "/tmp/a" + std::string(47, ' ') + "output" + std::string(21, ' ') + "missing\n" +
                  "/tmp/b" + std::string(47, ' ') + "output" + std::string(21, ' ') + "folder\n" +
                  "/dev/hd0" + std::string(45, ' ') + "boot disk" + std::string(18, ' ') +
                  "device\n/" + std::string(60, 'x') + " template" + std::string(19, ' ') +
                  "file, 1 byte\n");
}

TEST(DecodedUnitTextTest, PartsArePrintedAloneOrAll) {
    DecodedUnit unit;
    unit.files = {{"/tmp/a", "output", PathKind::nothing, 0}};
    std::string all;
    for (const std::string& name : desk::partNames()) {
        EXPECT_NE(printed(unit, name), "") << name;
        all += printed(unit, name);
    }
    EXPECT_EQ(desk::partNames(),
              (std::vector<std::string>{"params", "records", "tuning", "versions", "files"}));
    EXPECT_EQ(printed(unit, ""), all);
}

} // namespace

} // namespace orvane::test
