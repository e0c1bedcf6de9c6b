// SPDX-License-Identifier: Apache-2.0
#include "identity/vehicle_identity.h"
#include "tests/support/disturbed_reads.h"
#include "tests/support/unit_test.h"

namespace orvane::test {

/// Bytes from the serial's record to the end of the disk: the record lies 129 bytes into the last
/// mebibyte.
constexpr std::uint64_t SERIAL_BEFORE_END = MEBIBYTE - 129;

class UnitSerialTest : public UnitTest {
protected:
    static std::string serial() {
        std::string text = "earlier content";
        getUnitSerial(text);
        return text;
    }
    static std::string serialOf(const std::string& record) {
        setDiskFromEnd(SERIAL_BEFORE_END, record);
        return serial();
    }
};

// Rules: SER-01, SER-02
TEST_F(UnitSerialTest, FullRecordGivesEightCharacters) {
    EXPECT_EQ(serialOf("SN004217"), "SN004217");
}

// Rules: SER-02
TEST_F(UnitSerialTest, SerialEndsAtTheFirstZeroByte) {
    EXPECT_EQ(serialOf(std::string("AB\0\0\0\0\0\0", 8)), "AB");
    EXPECT_EQ(serialOf(std::string("AB\0CD\0EF", 8)), "AB");
    EXPECT_EQ(serialOf(std::string("ABCDEFG\0", 8)), "ABCDEFG");
    EXPECT_EQ(serialOf(std::string("\0ABCDEFG", 8)), "");
}

// Rules: SER-03
TEST_F(UnitSerialTest, RecordOfZerosGivesTheEmptyTextAndNotTheDefault) {
    EXPECT_EQ(serialOf(std::string(8, '\0')), "");
}

// Rules: SER-04
TEST_F(UnitSerialTest, BytesAreKeptAsTheyAre) {
    EXPECT_EQ(serialOf("  a\t\n\r= "), "  a\t\n\r= ");
    EXPECT_EQ(serialOf("\xFF\x80\x7F\x01\xC3\xA4\xFE\x1B"), "\xFF\x80\x7F\x01\xC3\xA4\xFE\x1B");
}

// Rules: SER-01
TEST_F(UnitSerialTest, NeighbouringRecordsDoNotShow) {
    setDiskFromEnd(MEBIBYTE, std::string(4096, 'x'));
    EXPECT_EQ(serialOf("SN004217"), "SN004217");
    EXPECT_EQ(serialOf(std::string("SN\0\0\0\0\0\0", 8)), "SN");
}

TEST_F(UnitSerialTest, DiskOfOneMebibyteHoldsTheRecord) {
    resetDisk(MEBIBYTE);
    EXPECT_EQ(serialOf("12345678"), "12345678");
}

// Rules: SER-06
TEST_F(UnitSerialTest, DeviceMayStartAtTheRecord) {
    resetDisk(SERIAL_BEFORE_END);
    EXPECT_EQ(serialOf("87654321"), "87654321");
}

// Rules: SER-05
TEST_F(UnitSerialTest, MissingDeviceGivesTheDefault) {
    remove(DISK_PATH);
    EXPECT_EQ(serial(), "ABCD1234abc");
}

// Rules: SER-05
TEST_F(UnitSerialTest, DeviceThatCannotBeOpenedGivesTheDefault) {
    remove(DISK_PATH);
    std::filesystem::create_symlink(DISK_PATH, DISK_PATH);
    EXPECT_EQ(serial(), "ABCD1234abc");
}

// Rules: SER-06
TEST_F(UnitSerialTest, DeviceTooShortForTheSeekGivesTheDefault) {
    resetDisk(SERIAL_BEFORE_END - 1);
    EXPECT_EQ(serial(), "ABCD1234abc");
}

// Rules: SER-05
TEST_F(UnitSerialTest, DeviceThatCannotBeReadGivesTheDefault) {
    putFolder(DISK_PATH);
    EXPECT_EQ(serial(), "ABCD1234abc");
}

// Rules: SER-07
TEST_F(UnitSerialTest, BytesThatAShortReadLacksAreNotInTheSerial) {
    setDiskFromEnd(SERIAL_BEFORE_END, "SN004217");
    const DisturbedReads reads = DisturbedReads::ofAtMost(3);
    EXPECT_EQ(serial(), "SN0");
    EXPECT_EQ(reads.count(), 1);
}

// Rules: SER-05
TEST_F(UnitSerialTest, DefaultIsLongerThanAnySerial) {
    remove(DISK_PATH);
    EXPECT_EQ(serial().size(), 11U);
    resetDisk(2 * MEBIBYTE);
    EXPECT_EQ(serialOf(std::string(16, 'S')).size(), 8U);
}

TEST_F(UnitSerialTest, EachCallReadsTheDeviceAgain) {
    EXPECT_EQ(serialOf("11111111"), "11111111");
    EXPECT_EQ(serialOf("22222222"), "22222222");
    remove(DISK_PATH);
    EXPECT_EQ(serial(), "ABCD1234abc");
}

TEST_F(UnitSerialTest, LeavesNoDescriptorOpen) {
    const int before = openDescriptors();
    EXPECT_EQ(serialOf("SN004217"), "SN004217");
    EXPECT_EQ(openDescriptors(), before);
    resetDisk(100);
    EXPECT_EQ(serial(), "ABCD1234abc");
    EXPECT_EQ(openDescriptors(), before);
    putFolder(DISK_PATH);
    EXPECT_EQ(serial(), "ABCD1234abc");
    EXPECT_EQ(openDescriptors(), before);
    remove(DISK_PATH);
    EXPECT_EQ(serial(), "ABCD1234abc");
    EXPECT_EQ(openDescriptors(), before);
}

} // namespace orvane::test
