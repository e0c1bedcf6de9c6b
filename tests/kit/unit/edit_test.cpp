// SPDX-License-Identifier: Apache-2.0
#include "kit/tuning/tuning_encode.h"
#include "tests/kit/description/description_equality.h"
#include "tests/kit/host/open_descriptors.h"
#include "tests/kit/unit/edit_fixture.h"
#include "tuning/tuning_file.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>
#include <sstream>
#include <string>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;

/// The block 3 of the fixture, with one field changed.
DpsBlock changedBlock(const char* key, const kit::TuningValue& value) {
    DpsBlock block{};
    block.bytes.fill(0xFF);
    kit::encodeTuningField(block, key, value);
    return block;
}

TEST_F(EditTest, ParameterIsSetAndNothingElse) {
    set({"param.134=0x1234", "param.22=255", "param.0xab=0"});
    kit::UnitDescription expected = found();
    make(wholeUnit());
    kit::UnitDescription unit = found();
    unit.image.params[134] = 0x1234;
    unit.image.params[22] = 255;
    EXPECT_TRUE(expected == unit);
}

TEST_F(EditTest, SlotIsSetAndPaddedWithZeros) {
    set({"slot.8=x", "slot.9=hex:41 42", "slot.0=0"});
    kit::UnitDescription expected = found();
    make(wholeUnit());
    kit::UnitDescription unit = found();
    unit.disk.slots[8] = "x";
    unit.disk.slots[9] = "AB";
    unit.disk.slots[0] = "0";
    EXPECT_TRUE(expected == unit);
}

TEST_F(EditTest, SerialIsSlotNine) {
    set({"serial=NEW=1"});
    EXPECT_EQ(found().disk.slots.at(9), "NEW=1");
    set({"serial=hex:00"});
    EXPECT_EQ(found().disk.slots.count(9), 0U);
}

TEST_F(EditTest, AuxiliaryAreaIsSetAsAWhole) {
    set({"aux=x"});
    EXPECT_EQ(found().disk.aux, std::optional<kit::Bytes>("x"));
    set({"aux=hex:ff00ff"});
    EXPECT_EQ(found().disk.aux, std::optional<kit::Bytes>(std::string("\xFF\0\xFF", 3)));
}

TEST_F(EditTest, TuningFieldIsSetAndNoOtherBit) {
    const kit::UnitDescription before = found();
    set({"tuning.3.qwaAGCSwitch=qwaOff"});
    kit::UnitDescription expected = before;
    expected.disk.tuning[3] = kit::describeTuningBlock(changedBlock("qwaAGCSwitch", "qwaOff"));
    EXPECT_TRUE(found() == expected);
}

TEST_F(EditTest, TuningFieldTakesWordsNumbersAndLists) {
    const std::vector<std::int64_t> list = {1, -2, 3, 0x7F, 5};
    for (const std::string value : {"1,-2,3,127,5", "1 -2 3 0x7f 5", " 1, -2,3 , 127 5 "}) {
        make(wholeUnit());
        set({"tuning.3.qwaNCParams=" + value});
        EXPECT_TRUE(found().disk.tuning.at(3) ==
                    kit::describeTuningBlock(changedBlock("qwaNCParams", list)))
            << value;
    }
    make(wholeUnit());
    set({"tuning.3.qwaNRAtten=-12"});
    EXPECT_TRUE(found().disk.tuning.at(3) ==
                kit::describeTuningBlock(changedBlock("qwaNRAtten", std::int64_t{-12})));
    make(wholeUnit());
    set({"tuning.0x3.qwaAECSwitch=0"});
    EXPECT_TRUE(found().disk.tuning.at(3) ==
                kit::describeTuningBlock(changedBlock("qwaAECSwitch", std::int64_t{0})));
}

TEST_F(EditTest, SeveralFieldsOfABlockAreAllSet) {
    set({"tuning.7.qwaSendGain=1", "tuning.7.qwaRecvGain=2", "tuning.8.qwaSendGain=3"});
    DpsBlock seven{};
    kit::encodeTuningField(seven, "qwaSendGain", std::int64_t{1});
    kit::encodeTuningField(seven, "qwaRecvGain", std::int64_t{2});
    EXPECT_TRUE(found().disk.tuning.at(7) == kit::describeTuningBlock(seven));
    EXPECT_EQ(std::get<std::int64_t>(found().disk.tuning.at(8).fields.at("qwaSendGain")), 3);
}

TEST_F(EditTest, TuningFileOfAnyBlockSetsTheFieldsAndLeavesTheOtherBits) {
    constexpr std::size_t BYTES_WITH_FIELDS = 179;
    DpsBlock source{};
    for (std::size_t at = 0; at < BYTES_WITH_FIELDS; ++at) {
        source.bytes[at] = static_cast<std::uint8_t>(at * 7);
    }
    std::ostringstream text;
    writeTuningText(text, 9, source);
    writeFile(hostFile(), text.str());
    set({"tuning.3=" + hostFile().string()});

    const kit::UnitDescription unit = found();
    std::ostringstream copied;
    writeTuningText(copied, 9, kit::encodeTuningBlock(unit.disk.tuning.at(3)));
    EXPECT_EQ(copied.str(), text.str());
    make(wholeUnit());
    EXPECT_EQ(unit.disk.tuning.at(3).raw, found().disk.tuning.at(3).raw);
    EXPECT_TRUE(unit.disk.tuning.at(4) == found().disk.tuning.at(4));
}

TEST_F(EditTest, LinksAreFollowedInsideTheUnit) {
    kit::UnitDescription unit = wholeUnit();
    unit.links = {{"/dev/hd0", "/dev/disk0"}, {IMAGE_PATH, "/tmp/image"}};
    unit.sparseFiles = {{"/dev/disk0", {2 * MEBIBYTE, {}}}, {"/tmp/image", {179, {}}}};
    make(unit);
    set({"serial=ABC", "param.1=5"});
    const std::string disk = readFile(root() / "dev/disk0");
    EXPECT_EQ(disk.substr(MEBIBYTE + 129, 4), std::string("ABC\0", 4));
    EXPECT_EQ(readFile(root() / "tmp/image").substr(0, 2), std::string("\x05\0", 2));
    EXPECT_TRUE(fs::is_symlink(root() / "dev/hd0"));
}

TEST_F(EditTest, ShortestImageAndDiskThatHoldAValueAreEnough) {
    kit::UnitDescription unit;
    unit.image.size = 135;
    unit.disk.size = 1048447;
    make(unit);
    set({"param.134=0xFFFF", "serial=12345678", "aux=x", "tuning.0.qwaDNSEnable=1"});
    EXPECT_EQ(readFile(root() / std::string(IMAGE_PATH).substr(1)).substr(132),
              std::string("\0\xFF\xFF", 3));
    const std::string disk = readFile(root() / "dev/hd0");
    EXPECT_EQ(disk.size(), 1048447U);
    EXPECT_EQ(disk.substr(0, 9), std::string("12345678\0", 9));
}

TEST_F(EditTest, NoAssignmentsChangeNothing) {
    EXPECT_EQ(refusalOf({}), "");
}

TEST_F(EditTest, RootFolderAndDescriptorsAreAsBefore) {
    const std::size_t before = openDescriptors();
    const fs::path hostCwd = fs::current_path();
    set({"param.22=2", "serial=x", "tuning.1.qwaSendGain=1"});
    EXPECT_EQ(openDescriptors(), before);
    EXPECT_EQ(fs::current_path(), hostCwd);
    EXPECT_TRUE(fs::exists(root()));
}

} // namespace

} // namespace orvane::test
