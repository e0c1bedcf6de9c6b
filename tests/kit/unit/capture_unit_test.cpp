// SPDX-License-Identifier: Apache-2.0
#include "kit/enter/entered_root.h"
#include "kit/host/kit_error.h"
#include "kit/unit/capture_unit.h"
#include "kit/unit/describe_inputs.h"
#include "kit/unit/describe_unit.h"
#include "kit/unit/marker.h"
#include "tests/kit/description/description_equality.h"
#include "tests/kit/unit/source_unit.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <string>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;

class CaptureUnitTest : public SourceUnitTest {
protected:
    /// Captures, and requires that the source is unchanged.
    void capture(bool redactsSerial = false) const {
        const auto before = state();
        kit::captureUnit(source(), root(), redactsSerial);
        EXPECT_EQ(differenceOf(before, state()), "");
    }

    std::string disk() const { return readFile(root() / "dev/hd0"); }

    /// A disk of slightly more than a mebibyte with this in slot 9, and `more` by offset from the
    /// base.
    void putDisk(const std::string& serial,
                 const std::map<std::size_t, std::string>& more = {}) const {
        std::string content(MEBIBYTE + 50, '\0');
        content.replace(50 + 129, serial.size(), serial);
        for (const auto& [offset, bytes] : more) {
            content.replace(50 + offset, bytes.size(), bytes);
        }
        put("/dev/hd0", content);
    }

    /// Requires that redaction ends with this complaint, and nothing is made.
    void refuseToRedact(const std::string& complaint) const {
        try {
            capture(true);
            FAIL() << complaint;
        } catch (const kit::KitError& error) {
            EXPECT_NE(std::string(error.what()).find(complaint), std::string::npos) << error.what();
        }
        EXPECT_FALSE(fs::exists(root()));
    }

    /// Slot 9 after redaction.
    std::string redacted(const std::string& serial) const {
        putDisk(serial);
        fs::remove_all(root());
        capture(true);
        return disk().substr(129, 8);
    }
};

TEST_F(CaptureUnitTest, UnitOfTheInputsIsMade) {
    put(IMAGE_PATH, std::string(179, 'i'));
    putDisk("SN004217", {{137, "gap"}, {3072, "aux"}, {4096, "tuning"}});
    put("/fs/mp/etc/airplay.conf", "stock");
    put("/fs/rwdata/.Version/a.inf", "Type=Application\n");
    putFolder("/tmp/iap1.cfg");
    capture();
    EXPECT_TRUE(kit::isKitUnit(root()));
    EXPECT_EQ(disk(), readFile(at("/dev/hd0")).substr(50));
    EXPECT_EQ(readFile(root() / std::string(IMAGE_PATH).substr(1)), std::string(179, 'i'));
    EXPECT_EQ(readFile(root() / "fs/mp/etc/airplay.conf"), "stock");
    EXPECT_EQ(readFile(root() / "fs/rwdata/.Version/a.inf"), "Type=Application\n");
    EXPECT_TRUE(fs::is_directory(root() / "tmp/iap1.cfg"));
    EXPECT_TRUE(kit::describeUnit(root()) == kit::describeInputs(source()));
}

TEST_F(CaptureUnitTest, CapturedUnitHasTheSameInputs) {
    putLink(IMAGE_PATH, "elsewhere");
    putFolder("/fs/mp/etc/airplay.conf");
    putDisk("SN004217");
    fs::remove(at("/tmp"));
    capture();
    EXPECT_TRUE(kit::describeInputs(root()) == kit::describeInputs(source()));
    EXPECT_FALSE(fs::exists(root() / "tmp"));
}

TEST_F(CaptureUnitTest, CurrentRootCanBeCapturedIntoItsOwnFolder) {
    putDisk("SN004217");
    const kit::EnteredRoot entered(source());
    fs::create_directory("/bench");
    kit::captureUnit("/", "/bench/unit", true);
    EXPECT_EQ(readFile("/bench/unit/dev/hd0").substr(129, 8), "XXXXXXXX");
    EXPECT_TRUE(kit::isKitUnit("/bench/unit"));
}

TEST_F(CaptureUnitTest, SerialBecomesAnXForEachByte) {
    EXPECT_EQ(redacted("SN004217"), "XXXXXXXX");
    EXPECT_EQ(redacted("SN42"), std::string("XXXX\0\0\0\0", 8));
    EXPECT_EQ(redacted("\xFF\n\x01\x80"), std::string("XXXX\0\0\0\0", 8));
    EXPECT_EQ(redacted(std::string("ABCD\0EFG", 8)), std::string("XXXX\0\0\0\0", 8));
    EXPECT_EQ(redacted(" SN42   "), "XXXXXXXX");
}

TEST_F(CaptureUnitTest, NothingButASerialThatIsThereIsSought) {
    EXPECT_EQ(redacted(std::string("\0SECRET!", 8)), std::string(8, '\0'));
    EXPECT_EQ(redacted(""), std::string(8, '\0'));
    EXPECT_EQ(redacted("        "), "XXXXXXXX");
    EXPECT_EQ(redacted("XX"), std::string("XX\0\0\0\0\0\0", 8)) << "redacted already";
}

TEST_F(CaptureUnitTest, SerialIsKeptUnlessRedactionIsRequested) {
    putDisk(std::string("AB\0CDEFG", 8));
    capture();
    EXPECT_EQ(disk().substr(129, 8), std::string("AB\0CDEFG", 8));
}

TEST_F(CaptureUnitTest, SerialIsRedactedEverywhereElse) {
    putDisk("SN004217", {{1, "SN004217 again"},
                         {134, "2SN004217"}, // across the end of slot 9, and in the gap
                         {3072, "aux SN004217SN004217"},
                         {4096, "SN004217"},
                         {MEBIBYTE - 8, "SN004217"}});
    put("/fs/mp/etc/airplay.conf", "serial = SN004217, not SN004218\nSN004217");
    put("/fs/mp/etc/mm/iap1.cfg", std::string(9000, '\0') + "SN004217" + std::string(9000, '\0'));
    put("/fs/rwdata/.Version/a.inf", "N=SN004217");
    const std::string serial = "SN004217";
    std::string content = readFile(at("/dev/hd0"));
    content.replace(50 + 129, 8, serial);
    put("/dev/hd0", content);
    capture(true);
    EXPECT_EQ(disk().find(serial), std::string::npos);
    EXPECT_EQ(disk().substr(1, 14), "XXXXXXXX again");
    EXPECT_EQ(disk().substr(3072, 20), "aux XXXXXXXXXXXXXXXX");
    EXPECT_EQ(disk().substr(MEBIBYTE - 8), "XXXXXXXX");
    EXPECT_EQ(readFile(root() / "fs/mp/etc/airplay.conf"),
              "serial = XXXXXXXX, not SN004218\nXXXXXXXX");
    EXPECT_EQ(readFile(root() / "fs/mp/etc/mm/iap1.cfg"),
              std::string(9000, '\0') + "XXXXXXXX" + std::string(9000, '\0'));
    EXPECT_EQ(readFile(root() / "fs/rwdata/.Version/a.inf"), "N=XXXXXXXX");
}

TEST_F(CaptureUnitTest, SerialOfLessThanFourBytesIsRefused) {
    for (const std::string serial : {"AB1", "A", " AB1    "}) {
        putDisk(serial);
        refuseToRedact("so few bytes also stand in other places by chance");
    }
    put("/fs/mp/etc/airplay.conf", "AB12 AB1 AB12");
    putDisk("AB12");
    capture(true);
    EXPECT_EQ(readFile(root() / "fs/mp/etc/airplay.conf"), "XXXX AB1 XXXX");
}

TEST_F(CaptureUnitTest, BlanksAroundTheSerialAreNoPartOfIt) {
    putDisk("  SN42  ");
    put("/fs/mp/etc/airplay.conf", "serial=SN42\n");
    capture(true);
    EXPECT_EQ(readFile(root() / "fs/mp/etc/airplay.conf"), "serial=XXXX\n");
}

TEST_F(CaptureUnitTest, SerialIsRedactedInTheImage) {
    putDisk("SN004217");
    std::string image(179, '\0');
    put(IMAGE_PATH, image.replace(7, 8, "SN004217").replace(171, 8, "SN004217"));
    capture(true);
    EXPECT_EQ(readFile(root() / std::string(IMAGE_PATH).substr(1)),
              image.replace(7, 8, "XXXXXXXX").replace(171, 8, "XXXXXXXX"));
    fs::remove_all(root());
    put(IMAGE_PATH, std::string((1U << 20U) - 3, 'i') + "SN004217"); // one described as a file
    capture(true);
    EXPECT_EQ(readFile(root() / std::string(IMAGE_PATH).substr(1)),
              std::string((1U << 20U) - 3, 'i') + "XXXXXXXX");
}

TEST_F(CaptureUnitTest, OverlappingSerialsAreRedactedWhole) {
    putDisk("ABAB", {{137, "ABABAB"}});
    put("/fs/mp/etc/airplay.conf", "-ABABABA-");
    capture(true);
    EXPECT_EQ(readFile(root() / "fs/mp/etc/airplay.conf"), "-XXXXXXA-");
    EXPECT_EQ(disk().substr(137, 7), std::string("XXXXXX\0", 7));
    fs::remove_all(root());
    putDisk(std::string("SNSNSNSN"), {{137, "SNSN"}});
    capture(true);
    EXPECT_EQ(disk().substr(129, 12), "XXXXXXXXXXXX") << "at the end of the slot, too";
}

TEST_F(CaptureUnitTest, SerialThatTheXsMakeAnewIsRedacted) {
    putDisk("XXAX", {{137, "XXAXXAX"}});
    put("/fs/mp/etc/airplay.conf", "XXAXAXAXAX");
    capture(true);
    EXPECT_EQ(readFile(root() / "fs/mp/etc/airplay.conf"), "XXXXXXXXXX");
    EXPECT_EQ(disk().substr(137, 7), "XXXXXXX");
}

TEST_F(CaptureUnitTest, SerialIsRedactedInLongFilesAtAnyPlace) {
    putDisk("SN004217");
    for (const std::size_t at : {0x3FFFCU, 0x40000U, 0x7FFF9U}) {
        std::string content(0x100000, 'c');
        put("/fs/mp/etc/airplay.conf", content.replace(at, 8, "SN004217"));
        fs::remove_all(root());
        capture(true);
        EXPECT_EQ(readFile(root() / "fs/mp/etc/airplay.conf"), content.replace(at, 8, "XXXXXXXX"));
    }
}

TEST_F(CaptureUnitTest, SerialIsRedactedInTheNamesOfVersionFiles) {
    putDisk("SN004217");
    put("/fs/rwdata/.Version/SN004217.inf", "Type=Application\n");
    put("/fs/rwdata/.Version/a.infSN004217", std::string(9000, '\0'));
    putFolder("/fs/rwdata/.Version/b-SN004217.inf");
    capture(true);
    EXPECT_EQ(readFile(root() / "fs/rwdata/.Version/XXXXXXXX.inf"), "Type=Application\n");
    EXPECT_EQ(readFile(root() / "fs/rwdata/.Version/a.infXXXXXXXX"), std::string(9000, '\0'));
    EXPECT_TRUE(fs::is_directory(root() / "fs/rwdata/.Version/b-XXXXXXXX.inf"));
    EXPECT_EQ(treeOf(root() / "fs/rwdata/.Version").size(), 3U);
}

TEST_F(CaptureUnitTest, SerialThatCanNotBeReplacedIsRefused) {
    putDisk("app.inf");
    put("/fs/rwdata/.Version/app.inf", "Type=Application\n");
    refuseToRedact("the serial also stands in the name of ");
    putDisk("SN004217");
    put("/fs/rwdata/.Version/SN004217.inf", "Type=Application\n");
    put("/fs/rwdata/.Version/XXXXXXXX.inf", "Type=Application\n");
    refuseToRedact("/root/fs/rwdata/.Version/SN004217.inf, and can't be replaced there");
    putDisk("airplay");
    put("/fs/mp/etc/airplay.conf", "stock");
    refuseToRedact("/root/fs/mp/etc/airplay.conf, and can't be replaced there");
    putDisk("layout 1");
    refuseToRedact("the serial also stands in the file ");
}

TEST_F(CaptureUnitTest, DiskWithoutRoomForTheSerialHasNoneToRedact) {
    put("/fs/mp/etc/airplay.conf", "xxxx");
    put("/dev/hd0", std::string(1048446, 'x'));
    capture(true);
    EXPECT_EQ(disk(), std::string(1048446, 'x'));
    fs::remove_all(root());
    put("/dev/hd0", std::string(1048447, 'x')); // the slot is the disk's first 8 bytes
    capture(true);
    EXPECT_EQ(disk().substr(0, 16), "XXXXXXXXXXXXXXXX");
    EXPECT_EQ(readFile(root() / "fs/mp/etc/airplay.conf"), "xxxx");
    fs::remove_all(root());
    fs::remove(at("/dev/hd0"));
    capture(true);
    EXPECT_FALSE(fs::exists(root() / "dev/hd0"));
}

TEST_F(CaptureUnitTest, ExistingRootIsRefusedAndKept) {
    fs::create_directory(root());
    writeFile(root() / "mine", "kept");
    EXPECT_THROW(capture(), kit::KitError);
    EXPECT_EQ(readFile(root() / "mine"), "kept");
}

} // namespace

} // namespace orvane::test
