// SPDX-License-Identifier: Apache-2.0
//
// What setValues refuses, with nothing changed.
#include "kit/host/kit_error.h"
#include "tests/kit/unit/edit_fixture.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <string>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;

/// An assignment, and the message after it and a colon.
struct Refusal {
    const char* assignment;
    const char* message;
};

constexpr char KNOWN[] = ": it takes param.N, serial, slot.N, aux, tuning.B.FIELD or tuning.B";

const Refusal REFUSALS[] = {
    {"param.134=70000", "parameter 134 is two bytes: 70000 does not fit"},
    {"param.134=-1", "parameter 134 is two bytes: -1 does not fit"},
    {"param.134=99999999999999999999",
     "parameter 134 is two bytes: 9223372036854775807 does not fit"},
    {"param.22=256", "parameter 22 is one byte: 256 does not fit"},
    {"param.22=", "parameter 22 takes a whole number, not \"\""},
    {"param.22=-", "parameter 22 takes a whole number, not \"-\""},
    {"param.22=1x", "parameter 22 takes a whole number, not \"1x\""},
    {"param.22=0x", "parameter 22 takes a whole number, not \"0x\""},
    {"param.22= 1", "parameter 22 takes a whole number, not \" 1\""},
    {"param.0=1", "a parameter number must be from 1 to 171, not \"0\""},
    {"param.172=1", "a parameter number must be from 1 to 171, not \"172\""},
    {"param.=1", "a parameter number must be from 1 to 171, not \"\""},
    {"slot.18=x", "a slot number must be from 0 to 17, not \"18\""},
    {"slot.9=123456789", "slot 9 takes 1 to 8 bytes, not 9"},
    {"slot.9=", "slot 9 takes 1 to 8 bytes, not 0"},
    {"serial=123456789", "slot 9 takes 1 to 8 bytes, not 9"},
    {"slot.9=hex:4", "hex needs two digits a byte: \"4\" has an odd number"},
    {"aux=", "the auxiliary area takes 1 to 1024 bytes, not 0"},
    {"aux=hex:zz", "hex has the digits 0-9 and a-f: \"zz\" is not a byte"},
    {"tuning.10.qwaSendGain=1", "a tuning block must be from 0 to 9, not \"10\""},
    {"tuning.3.qwaNone=1", "there is no tuning field \"qwaNone\""},
    {"tuning.3.=1", "there is no tuning field \"\""},
    {"tuning.3.qwaAECSwitch=on",
     "qwaAECSwitch has no word \"on\": it takes qwaOff, qwaOn, qwaIdle, or a code 0 to 3"},
    {"tuning.3.qwaAECSwitch=4", "qwaAECSwitch takes 0 to 3: 4 does not fit"},
    {"tuning.3.qwaSendGain=qwaOn", "qwaSendGain takes numbers, not the word \"qwaOn\""},
    {"tuning.3.qwaSendGain=40000", "qwaSendGain takes -32768 to 32767: 40000 does not fit"},
    {"tuning.3.qwaNCParams=1,2", "qwaNCParams takes 5 numbers, not 2"},
    {"tuning.3.qwaNCParams=", "qwaNCParams takes 5 numbers, not 0"},
    {"tuning.3.qwaNCParams=1,2,3,4,x", "qwaNCParams takes a whole number, not \"x\""},
    {"tuning.3=/missing/file", "cannot read /missing/file: No such file or directory"},
    {"tuning.3=/", "/ is not a regular file"},
    {"tuning=x", "unknown key \"tuning\": it takes param.N, serial, slot.N, aux, tuning.B.FIELD or "
                 "tuning.B"},
};

TEST_F(EditTest, WrongAssignmentIsNamedWithWhatWouldBeRight) {
    for (const Refusal& refusal : REFUSALS) {
        EXPECT_EQ(refusalOf({refusal.assignment}),
                  std::string(refusal.assignment) + ": " + refusal.message);
    }
}

TEST_F(EditTest, UnknownKeyIsNamedWithTheKnownOnes) {
    for (const std::string key :
         {"", "x", "Serial", "serial ", "params.22", "slot", "param", "disk"}) {
        const std::string assignment = key + "=1";
        EXPECT_EQ(refusalOf({assignment}),
                  std::string(assignment).append(": unknown key \"").append(key) + "\"" + KNOWN);
    }
    EXPECT_EQ(refusalOf({"serial"}), "\"serial\" is not of the form KEY=VALUE");
}

TEST_F(EditTest, WrongAssignmentAfterGoodOnesChangesNothing) {
    EXPECT_NE(refusalOf({"param.22=9", "serial=x", "tuning.3.qwaSendGain=1", "param.22=256"}), "");
    fs::resize_file(root() / std::string(IMAGE_PATH).substr(1), 100);
    EXPECT_EQ(refusalOf({"param.22=9", "serial=x", "param.134=1"}),
              "param.134=1: parameter 134 ends at byte 135 of an image of 100 bytes");
}

TEST_F(EditTest, ValueThatIsSetTwiceIsRefused) {
    writeFile(hostFile(), "");
    EXPECT_EQ(refusalOf({"param.22=1", "param.0x16=1"}),
              "param.0x16=1: parameter 22 is already set by \"param.22=1\"");
    EXPECT_EQ(refusalOf({"serial=a", "slot.9=b"}),
              "slot.9=b: slot 9 is already set by \"serial=a\"");
    EXPECT_EQ(refusalOf({"slot.15=a", "slot.1=b"}),
              "slot.1=b: slot 1 is already set by \"slot.15=a\"");
    EXPECT_EQ(refusalOf({"serial=a", "slot.15=b"}),
              "slot.15=b: slot 9 is already set by \"serial=a\"");
    EXPECT_EQ(refusalOf({"aux=a", "aux=a"}),
              "aux=a: the auxiliary area is already set by \"aux=a\"");
    EXPECT_EQ(refusalOf({"tuning.3.qwaSendGain=1", "tuning.0x3.qwaSendGain=1"}),
              "tuning.0x3.qwaSendGain=1: qwaSendGain of tuning block 3 is already set by "
              "\"tuning.3.qwaSendGain=1\"");
}

TEST_F(EditTest, FaultOfATuningFileNamesItsPlace) {
    const std::string file = hostFile().string();
    writeFile(file, "qwaAECSwitch on\n");
    EXPECT_EQ(refusalOf({"tuning.3=" + file}),
              file + ":1:1: orvane writes \"; Genereated config from DPS (blockId 3)\" here, not "
                     "\"qwaAECSwitch on\"");
    writeFile(file, "; Genereated config from DPS (blockId 2)\nqwaAECSwitch on\n");
    EXPECT_EQ(refusalOf({"tuning.3=" + file}),
              file + ":2:14: qwaAECSwitch has no word \"on\": it takes qwaOff, qwaOn, qwaIdle, or "
                     "a code 0 to 3");
}

TEST_F(EditTest, MissingImageAndDiskAreRefused) {
    kit::UnitDescription unit;
    unit.absent = {"/dev/hd0", IMAGE_PATH};
    make(unit);
    EXPECT_EQ(refusalOf({"param.22=1"}), std::string("param.22=1: cannot change ") + IMAGE_PATH +
                                             ": No such file or directory");
    const char* const gone = ": cannot change /dev/hd0: No such file or directory";
    for (const std::string text : {"serial=x", "aux=x", "tuning.3.qwaSendGain=1"}) {
        EXPECT_EQ(refusalOf({text}), text + gone);
    }
}

TEST_F(EditTest, FoldersInPlaceOfImageAndDiskAreRefused) {
    kit::UnitDescription unit;
    unit.folders = {"/dev/hd0", IMAGE_PATH};
    make(unit);
    EXPECT_EQ(refusalOf({"param.22=1"}),
              std::string("param.22=1: cannot change ") + IMAGE_PATH + ": Is a directory");
    EXPECT_EQ(refusalOf({"serial=x"}), "serial=x: cannot change /dev/hd0: Is a directory");
}

TEST_F(EditTest, LinkOutOfTheUnitIsNotFollowedThere) {
    const TemporaryFolder elsewhere;
    writeFile(elsewhere.path() / "disk", "mine");
    kit::UnitDescription unit;
    unit.links = {{"/dev/hd0", elsewhere.path() / "disk"}, {IMAGE_PATH, "/dev/null"}};
    make(unit);
    EXPECT_EQ(refusalOf({"serial=x"}),
              "serial=x: cannot change /dev/hd0: No such file or directory");
    EXPECT_NE(refusalOf({"param.22=1"}), "");
    EXPECT_EQ(readFile(elsewhere.path() / "disk"), "mine");
}

TEST_F(EditTest, DiskThatIsTooShortIsRefused) {
    kit::UnitDescription unit;
    unit.disk.size = 1044479;
    make(unit);
    EXPECT_EQ(refusalOf({"serial=x"}), "serial=x: slot 9 does not fit on a disk of 1044479 bytes: "
                                       "it needs 1048447");
    EXPECT_EQ(refusalOf({"aux=x"}), "aux=x: the auxiliary area does not fit on a disk of 1044479 "
                                    "bytes: it needs 1045504");
    EXPECT_EQ(refusalOf({"tuning.3.qwaSendGain=1"}),
              "tuning.3.qwaSendGain=1: the tuning area does not fit on a disk of 1044479 bytes: it "
              "needs 1044480");
}

TEST_F(EditTest, FolderThatTheKitDidNotMakeIsRefused) {
    fs::remove(root() / ".orvane-unit");
    EXPECT_EQ(refusalOf({"serial=x"}),
              root().string() +
                  " is not a unit that orvane-unit made: it has no file .orvane-unit");
    EXPECT_THROW(kit::setValues("/", {"serial=x"}), kit::KitError);
}

} // namespace

} // namespace orvane::test
