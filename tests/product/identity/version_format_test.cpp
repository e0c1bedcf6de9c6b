// SPDX-License-Identifier: Apache-2.0
#include "identity/software_version.h"

#include <gtest/gtest.h>

#include <cstddef>
#include <string>

namespace orvane::test {
namespace {

struct FormatCase {
    const char* text;
    const char* expected;
};

template <std::size_t Count>
void expectBytes(const FormatCase (&table)[Count]) {
    for (const FormatCase& row : table) {
        EXPECT_EQ(formatVersionByte(row.text), row.expected) << '"' << row.text << '"';
    }
}

template <std::size_t Count>
void expectVersions(const FormatCase (&table)[Count]) {
    for (const FormatCase& row : table) {
        EXPECT_EQ(formatVersion(row.text), row.expected) << '"' << row.text << '"';
    }
}

TEST(IsNoVersionTest, EmptyTextAndItsNameAreNoVersion) {
    EXPECT_TRUE(isNoVersion(""));
    EXPECT_TRUE(isNoVersion("N/A"));
    EXPECT_FALSE(isNoVersion("N"));
    EXPECT_FALSE(isNoVersion("0"));
}

// Rules: VER-32
TEST(FormatVersionByteTest, NumbersBecomeTwoLowerCaseHexadecimalDigits) {
    expectBytes({{"0", "00"},
                 {"1", "01"},
                 {"9", "09"},
                 {"10", "0a"},
                 {"15", "0f"},
                 {"16", "10"},
                 {"171", "ab"},
                 {"205", "cd"},
                 {"239", "ef"},
                 {"255", "ff"}});
}

// Rules: VER-31, VER-32
TEST(FormatVersionByteTest, AllBytesHaveTheirDigits) {
    static const std::string digits = "0123456789abcdef";
    for (std::size_t value = 0; value < 256; ++value) {
        const std::string expected{digits[value / 16], digits[value % 16]};
        EXPECT_EQ(formatVersionByte(std::to_string(value)), expected);
        EXPECT_EQ(formatVersionByte(std::to_string(value + 256)), expected);
    }
}

// Rules: VER-31
TEST(FormatVersionByteTest, NumbersFrom256OnAreReducedModulo256) {
    expectBytes({{"256", "00"},
                 {"257", "01"},
                 {"300", "2c"},
                 {"511", "ff"},
                 {"512", "00"},
                 {"65535", "ff"},
                 {"2147483391", "ff"},
                 {"2147483392", "00"}});
}

// Rules: VER-31, VER-33
TEST(FormatVersionByteTest, NegativeRemaindersAreTwosComplementIn32Bits) {
    expectBytes({{"-1", "ffffffff"},
                 {"-2", "fffffffe"},
                 {"-16", "fffffff0"},
                 {"-128", "ffffff80"},
                 {"-255", "ffffff01"},
                 {"-256", "00"},
                 {"-257", "ffffffff"},
                 {"-300", "ffffffd4"},
                 {"-512", "00"},
                 {"-0", "00"}});
}

// Rules: VER-30
TEST(FormatVersionByteTest, NumbersOutOfRangeCountAsTheNearestInRange) {
    expectBytes({{"2147483646", "fe"},
                 {"2147483647", "ff"},
                 {"2147483648", "ff"},
                 {"2147483649", "ff"},
                 {"4294967295", "ff"},
                 {"4294967296", "ff"},
                 {"4294967297", "ff"},
                 {"9223372036854775807", "ff"},
                 {"9223372036854775808", "ff"},
                 {"18446744073709551616", "ff"},
                 {"18446744073709551618", "ff"},
                 {"-2147483647", "ffffff01"},
                 {"-2147483648", "00"},
                 {"-2147483649", "00"},
                 {"-2147483650", "00"},
                 {"-4294967295", "00"},
                 {"-4294967297", "00"},
                 {"-9223372036854775809", "00"},
                 {"-18446744073709551618", "00"}});
}

TEST(FormatVersionByteTest, NumbersOfAnyLengthAreRead) {
    const std::string nines(60, '9');
    EXPECT_EQ(formatVersionByte(nines), "ff");
    EXPECT_EQ(formatVersionByte("+" + nines), "ff");
    EXPECT_EQ(formatVersionByte("-" + nines), "00");
    EXPECT_EQ(formatVersionByte(nines + "x"), "ff");
    const std::string zeros(60, '0');
    EXPECT_EQ(formatVersionByte(zeros), "00");
    EXPECT_EQ(formatVersionByte(zeros + "5"), "05");
    EXPECT_EQ(formatVersionByte("-" + zeros + "257"), "ffffffff");
}

// Rules: VER-28
TEST(FormatVersionByteTest, LeadingZerosAreDecimal) {
    expectBytes({{"00", "00"}, {"007", "07"}, {"010", "0a"}, {"08", "08"}, {"-010", "fffffff6"}});
}

// Rules: VER-28
TEST(FormatVersionByteTest, LeadingWhiteSpaceIsSkipped) {
    expectBytes({{" 5", "05"},
                 {"    12", "0c"},
                 {"\t5", "05"},
                 {"\n5", "05"},
                 {"\v5", "05"},
                 {"\f5", "05"},
                 {"\r5", "05"},
                 {" \t\r\n-1", "ffffffff"},
                 {" +5", "05"},
                 {"\xA0"
                  "5",
                  "00"}});
}

// Rules: VER-28
TEST(FormatVersionByteTest, OneSignIsAllowed) {
    expectBytes({{"+5", "05"},
                 {"+0", "00"},
                 {"+300", "2c"},
                 {"+-5", "00"},
                 {"-+5", "00"},
                 {"--5", "00"},
                 {"++5", "00"},
                 {"+ 5", "00"},
                 {"- 5", "00"},
                 {"+", "00"},
                 {"-", "00"}});
}

// Rules: VER-28
TEST(FormatVersionByteTest, NumberEndsAtTheFirstNonDigit) {
    expectBytes({{"5x", "05"},
                 {"5 6", "05"},
                 {"5-6", "05"},
                 {"5+6", "05"},
                 {"12_34", "0c"},
                 {"3.9", "03"},
                 {"1,234", "01"},
                 {"1'234", "01"},
                 {"1e3", "01"},
                 {"12a", "0c"},
                 {"0x1F", "00"},
                 {"0X1F", "00"},
                 {"0b11", "00"},
                 {"-1r", "ffffffff"},
                 {"7\r", "07"},
                 {"1/2", "01"},
                 {"1:2", "01"}});
}

// Rules: VER-29
TEST(FormatVersionByteTest, TextThatIsNotANumberIsZero) {
    expectBytes({{"", "00"},
                 {" ", "00"},
                 {"x", "00"},
                 {"x5", "00"},
                 {"_5", "00"},
                 {".5", "00"},
                 {"N/A", "00"},
                 {"abc", "00"},
                 {"f", "00"},
                 {"/", "00"},
                 {":", "00"},
                 {"\xD9\xA3", "00"}});
}

TEST(FormatVersionByteTest, ZeroByteIsANonDigit) {
    EXPECT_EQ(formatVersionByte({'5', '\0', '6'}), "05");
    EXPECT_EQ(formatVersionByte({'\0', '5'}), "00");
    EXPECT_EQ(formatVersionByte({' ', '\0', '5'}), "00");
    EXPECT_EQ(formatVersionByte({'-', '\0', '5'}), "00");
}

// Rules: VER-23, VER-24
TEST(FormatVersionTest, MissingVersionGivesTheDefault) {
    EXPECT_STREQ(DEFAULT_SOFTWARE_VERSION, "000000");
    expectVersions({{"", "000000"}, {"N/A", "000000"}});
}

// Rules: VER-25, VER-26
TEST(FormatVersionTest, ThreeComponentsAreJoined) {
    expectVersions({{"3.10.2", "030a02"},
                    {"1.2.3_45", "010203"},
                    {"2.0.1", "020001"},
                    {"3.10.2_rc", "030a02"},
                    {"255.16.1", "ff1001"},
                    {"256.15.x", "000f00"}});
}

// Rules: VER-27
TEST(FormatVersionTest, MissingComponentsRepeatTheOneBefore) {
    expectVersions({{"1.2", "010202"}, {"7", "070707"}, {"7_8", "070707"}, {"1.2_3", "010202"}});
}

// Rules: VER-34
TEST(FormatVersionTest, ComponentsAfterTheThirdDoNotMatter) {
    expectVersions({{"1.2.3.4", "010203"}, {"1.2.3.4.5_6", "010203"}, {"1.2.3_4.5", "010203"}});
}

// Rules: VER-29
TEST(FormatVersionTest, EmptyComponentsAreZero) {
    expectVersions({{".", "000000"},
                    {"..", "000000"},
                    {"...", "000000"},
                    {"1.", "010000"},
                    {"1..", "010000"},
                    {"1..3", "010003"},
                    {"1.2.", "010200"},
                    {".5", "000505"},
                    {".5.6", "000506"},
                    {"..5", "000005"},
                    {"1.2._3", "010200"}});
}

// Rules: VER-26
TEST(FormatVersionTest, UnderscoreEndsAComponentsNumberOnly) {
    expectVersions({{"1_9.2.3", "010203"}, {"1.2_9.3", "010203"}, {"_1.2.3", "000203"}});
}

// Rules: VER-24, VER-29
TEST(FormatVersionTest, TextThatIsNotAVersionGivesZeros) {
    expectVersions({{"unknown", "000000"},
                    {"n/a", "000000"},
                    {"N/A.1", "000101"},
                    {"N/A ", "000000"},
                    {"v1.2.3", "000203"},
                    {" ", "000000"}});
}

// Rules: VER-33
TEST(FormatVersionTest, NegativeComponentsTakeEightDigits) {
    expectVersions({{"-1.2.3", "ffffffff0203"},
                    {"1.-300.3", "01ffffffd403"},
                    {"1.2.-257", "0102ffffffff"},
                    {"-1", "ffffffffffffffffffffffff"},
                    {"-256.-512.-0", "000000"}});
}

TEST(FormatVersionTest, WhiteSpaceAndCarriageReturnsAreNotPartOfTheNumbers) {
    expectVersions({{" 1 . 2 . 3 ", "010203"}, {"1.2.3\r", "010203"}, {"\t1.\t2.\t3\t", "010203"}});
}

TEST(FormatVersionTest, ZeroByteEndsANumberAndNotTheText) {
    EXPECT_EQ(formatVersion({'1', '\0', '9', '.', '2', '.', '3'}), "010203");
    EXPECT_EQ(formatVersion({'1', '.', '2', '\0', '9', '.', '3', '\0', '9'}), "010203");
}

TEST(FormatVersionTest, LongTextsAreReadWhole) {
    const std::string tail(100000, 'x');
    const std::string text = "1" + tail + ".2" + tail + ".3" + tail;
    EXPECT_EQ(formatVersion(text), "010203");
}

} // namespace
} // namespace orvane::test
