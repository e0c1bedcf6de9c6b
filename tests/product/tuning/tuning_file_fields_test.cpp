// SPDX-License-Identifier: Apache-2.0
//
// The line that each field of a block gives.
#include "tests/product/tuning/expected_layout.h"
#include "tests/product/tuning/tuning_test.h"

namespace orvane::test {

namespace {

/// The bytes of a 16-bit value on the disk.
std::string littleEndian(std::int32_t value) {
    const auto bits = static_cast<std::uint16_t>(value);
    return {static_cast<char>(bits & 0xFF), static_cast<char>(bits >> 8)};
}

std::string oneByte(unsigned value) {
    return {static_cast<char>(value)};
}

} // namespace

class TuningFileFieldsTest : public TuningTest {
protected:
    static std::string wordOf(DpsKind kind, std::int32_t code) {
        static const std::string switches[] = {"", "qwaOff", "qwaOn", "qwaIdle"};
        static const std::string modes[] = {"", "qwaSingleChannel", "qwaMultiChannel",
                                            "qwaCombined"};
        if (code < 1 || code > 3) {
            return "";
        }
        return kind == DpsKind::modeWord ? modes[code] : switches[code];
    }

    /// The line of a field whose element `element` is `value`; all others are zero.
    static std::string expectedLine(const DpsField& field, std::size_t element,
                                    std::int32_t value) {
        std::string line = std::string(field.key) + " ";
        if (field.kind == DpsKind::list) {
            for (std::size_t i = 0; i < field.count; ++i) {
                line += i == element ? std::to_string(value) + " " : "0 ";
            }
            return line;
        }
        return line +
               (field.kind == DpsKind::number ? std::to_string(value) : wordOf(field.kind, value));
    }

    /// Fails unless setting these bytes in a block of zeros gives that field's line and changes no
    /// other.
    static void expectOnlyLine(std::size_t row, const std::string& line, std::size_t offset,
                               const std::string& bytes) {
        std::vector<std::string> expected = splitLines(renderedWith(0, std::string(1, '\0')));
        expected.at(row + 1) = line;
        EXPECT_EQ(splitLines(renderedWith(offset, bytes)), expected);
    }

    static std::string lineWith(const std::string& key, std::size_t offset,
                                const std::string& bytes) {
        return lineOf(renderedWith(offset, bytes), key);
    }
};

// Rules: TUN-17
TEST_F(TuningFileFieldsTest, CodeFieldsChangeTheirOwnLineOnly) {
    for (std::size_t row = 0; row < EXPECTED_FIELD_COUNT; ++row) {
        const DpsField& field = EXPECTED_LAYOUT[row];
        for (unsigned code = 1; field.encoding == DpsEncoding::code2 && code <= 3; ++code) {
            expectOnlyLine(row, expectedLine(field, 0, static_cast<std::int32_t>(code)),
                           field.offset, oneByte(code << field.bit));
        }
    }
}

TEST_F(TuningFileFieldsTest, ByteFieldsChangeTheirOwnLineOnly) {
    for (std::size_t row = 0; row < EXPECTED_FIELD_COUNT; ++row) {
        const DpsField& field = EXPECTED_LAYOUT[row];
        for (const unsigned value : {1U, 2U, 3U, 4U, 6U, 127U, 128U, 255U}) {
            if (field.encoding == DpsEncoding::u8) {
                expectOnlyLine(row, expectedLine(field, 0, static_cast<std::int32_t>(value)),
                               field.offset, oneByte(value));
            }
        }
    }
}

TEST_F(TuningFileFieldsTest, WideFieldsChangeTheirOwnElementOnly) {
    for (std::size_t row = 0; row < EXPECTED_FIELD_COUNT; ++row) {
        const DpsField& field = EXPECTED_LAYOUT[row];
        for (std::size_t i = 0; field.encoding == DpsEncoding::i16 && i < field.count; ++i) {
            for (const std::int32_t value : {1, 2, 3, 258, 513, -1, -254, 32767, -32768}) {
                expectOnlyLine(row, expectedLine(field, i, value), field.offset + 2 * i,
                               littleEndian(value));
            }
        }
    }
}

// Rules: TUN-21
TEST_F(TuningFileFieldsTest, UnreadBitsChangeNothing) {
    const std::string ofZeros = renderedWith(0, std::string(1, '\0'));
    for (const UnreadBits& unread : UNREAD_BITS) {
        for (std::size_t byte = unread.first; byte <= unread.last; ++byte) {
            for (unsigned bit = 1; bit <= 0x80; bit <<= 1) {
                if ((unread.mask & bit) != 0) {
                    EXPECT_EQ(renderedWith(byte, oneByte(bit)), ofZeros) << byte << ' ' << bit;
                }
            }
            EXPECT_EQ(renderedWith(byte, oneByte(unread.mask)), ofZeros) << byte;
        }
    }
}

// Rules: TUN-21
TEST_F(TuningFileFieldsTest, UnreadBitsChangeNothingAmongOnes) {
    const std::string ones(BLOCK_SIZE, '\xFF');
    const std::string ofOnes = renderedWith(0, ones);
    for (const UnreadBits& unread : UNREAD_BITS) {
        for (std::size_t byte = unread.first; byte <= unread.last; ++byte) {
            std::string bytes = ones;
            bytes.at(byte) = static_cast<char>(0xFF & ~unread.mask);
            EXPECT_EQ(renderedWith(0, bytes), ofOnes) << byte;
        }
    }
}

// Rules: TUN-12, TUN-17
TEST_F(TuningFileFieldsTest, FourSwitchesOfAByteHaveTheirWords) {
    const std::vector<std::string> lines = splitLines(renderedWith(0, "\xE4"));
    EXPECT_EQ(lines.at(1), "qwaAECSwitch ");
    EXPECT_EQ(lines.at(2), "qwaAGCSwitch qwaOff");
    EXPECT_EQ(lines.at(3), "qwaDiagSwitch qwaOn");
    EXPECT_EQ(lines.at(4), "qwaHFESwitch qwaIdle");
}

// Rules: TUN-13
TEST_F(TuningFileFieldsTest, ModeHasItsWords) {
    EXPECT_EQ(lineWith("qwaWNDBMode", 4, "\x40"), "qwaWNDBMode qwaSingleChannel");
    EXPECT_EQ(lineWith("qwaWNDBMode", 4, "\x80"), "qwaWNDBMode qwaMultiChannel");
    EXPECT_EQ(lineWith("qwaWNDBMode", 4, "\xC0"), "qwaWNDBMode qwaCombined");
    EXPECT_EQ(lineWith("qwaWNDBMode", 4, "\x3F"), "qwaWNDBMode ");
}

// Rules: FLD-18
TEST_F(TuningFileFieldsTest, ByteSwitchTakesAllEightBits) {
    EXPECT_EQ(lineWith("qwaWNDBSwitch", 5, "\x02"), "qwaWNDBSwitch qwaOn");
    EXPECT_EQ(lineWith("qwaWNDBSwitch", 5, "\x03"), "qwaWNDBSwitch qwaIdle");
    for (const unsigned value : {0x04U, 0x05U, 0x06U, 0x41U, 0x81U, 0xFFU}) {
        EXPECT_EQ(lineWith("qwaWNDBSwitch", 5, oneByte(value)), "qwaWNDBSwitch ");
    }
}

// Rules: TUN-14, FLD-20, FLD-43
TEST_F(TuningFileFieldsTest, WideSwitchesTakeAllSixteenBits) {
    EXPECT_EQ(lineWith("qwaLFRSwitch", 8, littleEndian(2)), "qwaLFRSwitch qwaOn");
    EXPECT_EQ(lineWith("qwaIVOSwitch", 169, littleEndian(3)), "qwaIVOSwitch qwaIdle");
    for (const std::int32_t value : {258, 257, 513, 4, 0x200, -1, -2, -3, -32767}) {
        EXPECT_EQ(lineWith("qwaLFRSwitch", 8, littleEndian(value)), "qwaLFRSwitch ") << value;
        EXPECT_EQ(lineWith("qwaIVOSwitch", 169, littleEndian(value)), "qwaIVOSwitch ") << value;
    }
}

// Rules: TUN-15, TUN-18, TUN-19
TEST_F(TuningFileFieldsTest, WideNumbersAreSignedAndBytesAreNot) {
    EXPECT_EQ(lineWith("qwaAECFiltLen", 6, "\xFF\xFF"), "qwaAECFiltLen -1");
    EXPECT_EQ(lineWith("qwaAECFiltLen", 6, std::string("\0\x80", 2)), "qwaAECFiltLen -32768");
    EXPECT_EQ(lineWith("qwaAECFiltLen", 6, "\xFF\x7F"), "qwaAECFiltLen 32767");
    EXPECT_EQ(lineWith("qwaHFEExtent", 10, "\xFF"), "qwaHFEExtent 255");
}

// Rules: FLD-42, FLD-44
TEST_F(TuningFileFieldsTest, FieldsNamedEnableAreNumbersToo) {
    EXPECT_EQ(lineWith("qwaDNSEnable", 167, "\x34\x12"), "qwaDNSEnable 4660");
    EXPECT_EQ(lineWith("qwaDNSEnable", 167, littleEndian(1)), "qwaDNSEnable 1");
    EXPECT_EQ(lineWith("qwaMEQEnable", 171, littleEndian(2)), "qwaMEQEnable 2 0 0 0 ");
}

// Rules: TUN-16, TUN-20
TEST_F(TuningFileFieldsTest, EachListElementIsFollowedByASpace) {
    const std::string bytes =
        littleEndian(1) + littleEndian(-2) + littleEndian(3) + littleEndian(0) + littleEndian(5);
    EXPECT_EQ(lineWith("qwaNCParams", 13, bytes), "qwaNCParams 1 -2 3 0 5 ");
}

TEST_F(TuningFileFieldsTest, ReceiveAndSendListsHaveDifferentOrders) {
    const std::vector<std::string> lines = splitLines(rendered(2));
    ASSERT_EQ(lines.size(), 45U);
    EXPECT_EQ(lines.at(25), "qwaRecvAGCAmpTgts 0 0 ");
    EXPECT_EQ(lines.at(26), "qwaRecvAGCGainVals 0 0 0 ");
    EXPECT_EQ(lines.at(27), "qwaRecvAGCMaxRates 0 0 ");
    EXPECT_EQ(lines.at(33), "qwaSendAGCMaxRates 0 0 ");
    EXPECT_EQ(lines.at(34), "qwaSendAGCAmpTgts 0 0 ");
    EXPECT_EQ(lines.at(35), "qwaSendAGCGainVals 0 0 0 ");
    EXPECT_EQ(lines.at(39).substr(0, 21), "qwaSendParamEQ2Nodes ");
    EXPECT_EQ(lines.at(40).substr(0, 20), "qwaSendParamEQNodes ");
}

} // namespace orvane::test
