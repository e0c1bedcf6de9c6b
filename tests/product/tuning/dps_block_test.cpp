// SPDX-License-Identifier: Apache-2.0
#include "tests/product/tuning/expected_layout.h"
#include "tuning/dps_block.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <climits>
#include <cstring>
#include <initializer_list>
#include <string>

namespace orvane::test {
namespace {

/// A block with these bytes from `offset` on and zeros elsewhere.
DpsBlock blockWith(std::size_t offset, std::initializer_list<std::uint8_t> bytes) {
    DpsBlock block{};
    std::size_t place = offset;
    for (const std::uint8_t byte : bytes) {
        block.bytes.at(place++) = byte;
    }
    return block;
}

const DpsField& fieldOf(const std::string& key) {
    for (const DpsField& field : DPS_LAYOUT) {
        if (key == field.key) {
            return field;
        }
    }
    ADD_FAILURE() << "no field " << key;
    return DPS_LAYOUT.front();
}

std::int32_t decoded(const std::string& key, const DpsBlock& block, std::size_t element = 0) {
    return decodeField(block, fieldOf(key), element);
}

int fieldsOf(DpsEncoding encoding, DpsKind kind) {
    int count = 0;
    for (const DpsField& field : DPS_LAYOUT) {
        count += field.encoding == encoding && field.kind == kind ? 1 : 0;
    }
    return count;
}

TEST(DpsBlockTest, AreaIsTenBlocksOf188Bytes) {
    EXPECT_EQ(DPS_BLOCK_SIZE, 188U);
    EXPECT_EQ(DPS_BLOCK_COUNT, 10);
    EXPECT_EQ(DPS_AREA_SIZE, 1880U);
    EXPECT_EQ(sizeof(DpsBlock), 188U);
    EXPECT_EQ(sizeof(DpsArea), 1880U);
}

TEST(DpsBlockTest, BlocksInUseAreTwoAndThree) {
    EXPECT_EQ(DPS_BLOCK_SPEECHREC, 2);
    EXPECT_EQ(DPS_BLOCK_TELEPHONY, 3);
}

TEST(DpsBlockTest, BlocksLieBackToBackFromTheAreasFirstByte) {
    std::array<std::uint8_t, 1880> bytes{};
    for (std::size_t i = 0; i < bytes.size(); ++i) {
        bytes.at(i) = static_cast<std::uint8_t>(i / 188);
    }
    DpsArea area{};
    std::memcpy(&area, bytes.data(), bytes.size());
    for (std::size_t blockId = 0; blockId < 10; ++blockId) {
        for (const std::uint8_t byte : area.at(blockId).bytes) {
            ASSERT_EQ(byte, blockId);
        }
    }
}

TEST(DpsBlockTest, ElementsTakeOneByteOrTwo) {
    EXPECT_EQ(dpsElementSize(DpsEncoding::code2), 1U);
    EXPECT_EQ(dpsElementSize(DpsEncoding::u8), 1U);
    EXPECT_EQ(dpsElementSize(DpsEncoding::i16), 2U);
}

// Rules: FLD-01 to FLD-44
TEST(DpsLayoutTest, RowsAreAsExpected) {
    ASSERT_EQ(DPS_FIELD_COUNT, 44U);
    ASSERT_EQ(DPS_LAYOUT.size(), EXPECTED_FIELD_COUNT);
    for (std::size_t row = 0; row < EXPECTED_FIELD_COUNT; ++row) {
        const DpsField& field = DPS_LAYOUT.at(row);
        const DpsField& expected = EXPECTED_LAYOUT[row];
        SCOPED_TRACE(expected.key);
        EXPECT_STREQ(field.key, expected.key);
        EXPECT_EQ(field.offset, expected.offset);
        EXPECT_EQ(field.bit, expected.bit);
        EXPECT_EQ(field.encoding, expected.encoding);
        EXPECT_EQ(field.kind, expected.kind);
        EXPECT_EQ(field.count, expected.count);
    }
}

TEST(DpsLayoutTest, KindsHaveTheirNumberOfFields) {
    EXPECT_EQ(fieldsOf(DpsEncoding::code2, DpsKind::switchWord), 16);
    EXPECT_EQ(fieldsOf(DpsEncoding::code2, DpsKind::modeWord), 1);
    EXPECT_EQ(fieldsOf(DpsEncoding::u8, DpsKind::switchWord), 1);
    EXPECT_EQ(fieldsOf(DpsEncoding::i16, DpsKind::switchWord), 2);
    EXPECT_EQ(fieldsOf(DpsEncoding::u8, DpsKind::number), 3);
    EXPECT_EQ(fieldsOf(DpsEncoding::i16, DpsKind::number), 9);
    EXPECT_EQ(fieldsOf(DpsEncoding::i16, DpsKind::list), 12);
}

TEST(DpsLayoutTest, FieldsAndUnreadBitsCoverTheBlockOnce) {
    std::array<unsigned, 188> seen{};
    const auto cover = [&seen](std::size_t byte, unsigned mask) {
        EXPECT_EQ(seen.at(byte) & mask, 0U) << "byte " << byte;
        seen.at(byte) |= mask;
    };
    for (const DpsField& field : DPS_LAYOUT) {
        if (field.encoding == DpsEncoding::code2) {
            cover(field.offset, 3U << field.bit);
            continue;
        }
        const std::size_t width = field.encoding == DpsEncoding::u8 ? 1 : 2;
        for (std::size_t byte = 0; byte < width * field.count; ++byte) {
            cover(field.offset + byte, 0xFF);
        }
    }
    for (const UnreadBits& unread : UNREAD_BITS) {
        for (std::size_t byte = unread.first; byte <= unread.last; ++byte) {
            cover(byte, unread.mask);
        }
    }
    for (std::size_t byte = 0; byte < seen.size(); ++byte) {
        EXPECT_EQ(seen.at(byte), 0xFFU) << "byte " << byte;
    }
}

std::size_t longestWord(const std::array<QwaWord, 3>& words) {
    std::size_t longest = 0;
    for (const QwaWord& entry : words) {
        longest = std::max(longest, std::strlen(entry.word));
    }
    return longest;
}

/// Key, blank, value, line end: tuning_file.cpp has room for that much.
TEST(DpsLayoutTest, EveryLineFitsItsBuffer) {
    std::size_t longest = 0;
    for (const DpsField& field : DPS_LAYOUT) {
        std::size_t value = std::strlen("-32768");
        if (field.kind == DpsKind::switchWord) {
            value = longestWord(qwaSwitchWords);
        } else if (field.kind == DpsKind::modeWord) {
            value = longestWord(qwaModeWords);
        } else if (field.kind == DpsKind::list) {
            value = field.count * std::strlen("-32768 ");
        }
        longest = std::max(longest, std::strlen(field.key) + 1 + value + 1);
    }
    EXPECT_EQ(longest, DPS_LINE_MAX);
}

TEST(DecodeFieldTest, ZerosDecodeToZero) {
    const DpsBlock block{};
    for (const DpsField& field : EXPECTED_LAYOUT) {
        for (std::size_t element = 0; element < field.count; ++element) {
            EXPECT_EQ(decodeField(block, field, element), 0) << field.key;
        }
    }
}

TEST(DecodeFieldTest, OnesDecodeToTheHighestCodeOrMinusOne) {
    DpsBlock block{};
    block.bytes.fill(0xFF);
    for (const DpsField& field : EXPECTED_LAYOUT) {
        const std::int32_t expected = field.encoding == DpsEncoding::code2 ? 3
                                      : field.encoding == DpsEncoding::u8  ? 255
                                                                           : -1;
        for (std::size_t element = 0; element < field.count; ++element) {
            EXPECT_EQ(decodeField(block, field, element), expected) << field.key;
        }
    }
}

// Rules: TUN-17
TEST(DecodeFieldTest, FourCodesShareAByteFromTheLowestBitsUp) {
    const DpsBlock block = blockWith(0, {0xE4});
    EXPECT_EQ(decoded("qwaAECSwitch", block), 0);
    EXPECT_EQ(decoded("qwaAGCSwitch", block), 1);
    EXPECT_EQ(decoded("qwaDiagSwitch", block), 2);
    EXPECT_EQ(decoded("qwaHFESwitch", block), 3);
    const DpsBlock reverse = blockWith(0, {0x1B});
    EXPECT_EQ(decoded("qwaAECSwitch", reverse), 3);
    EXPECT_EQ(decoded("qwaAGCSwitch", reverse), 2);
    EXPECT_EQ(decoded("qwaDiagSwitch", reverse), 1);
    EXPECT_EQ(decoded("qwaHFESwitch", reverse), 0);
}

// Rules: TUN-18
TEST(DecodeFieldTest, ByteIsUnsigned) {
    for (const int value : {0, 1, 127, 128, 255}) {
        const auto byte = static_cast<std::uint8_t>(value);
        EXPECT_EQ(decoded("qwaHFEExtent", blockWith(10, {byte})), value);
        EXPECT_EQ(decoded("qwaRECSuppress", blockWith(25, {byte})), value);
        EXPECT_EQ(decoded("qwaWNDBSuppress", blockWith(166, {byte})), value);
        EXPECT_EQ(decoded("qwaWNDBSwitch", blockWith(5, {byte})), value);
    }
}

TEST(DecodeFieldTest, WideSwitchesTakeTheirWholeValue) {
    EXPECT_EQ(decoded("qwaWNDBSwitch", blockWith(5, {0x02})), 2);
    EXPECT_EQ(decoded("qwaWNDBSwitch", blockWith(5, {0x06})), 6);
    EXPECT_EQ(decoded("qwaLFRSwitch", blockWith(8, {0x01, 0x00})), 1);
    EXPECT_EQ(decoded("qwaLFRSwitch", blockWith(8, {0xFF, 0xFF})), -1);
    EXPECT_EQ(decoded("qwaLFRSwitch", blockWith(8, {0x02, 0x01})), 258);
    EXPECT_EQ(decoded("qwaIVOSwitch", blockWith(169, {0x03, 0x00})), 3);
    EXPECT_EQ(decoded("qwaIVOSwitch", blockWith(169, {0x00, 0x80})), -32768);
}

// Rules: TUN-19
TEST(DecodeFieldTest, SixteenBitsAreLittleEndianAndSigned) {
    EXPECT_EQ(decoded("qwaAECFiltLen", blockWith(6, {0xFF, 0xFF})), -1);
    EXPECT_EQ(decoded("qwaAECFiltLen", blockWith(6, {0x00, 0x80})), -32768);
    EXPECT_EQ(decoded("qwaAECFiltLen", blockWith(6, {0x01, 0x80})), -32767);
    EXPECT_EQ(decoded("qwaAECFiltLen", blockWith(6, {0xFF, 0x7F})), 32767);
    EXPECT_EQ(decoded("qwaAECFiltLen", blockWith(6, {0x80, 0x00})), 128);
    EXPECT_EQ(decoded("qwaAECFiltLen", blockWith(6, {0x00, 0x01})), 256);
    EXPECT_EQ(decoded("qwaDNSEnable", blockWith(167, {0x34, 0x12})), 4660);
}

// Rules: TUN-20
TEST(DecodeFieldTest, ListElementsFollowOneAnother) {
    const DpsBlock block =
        blockWith(13, {0x00, 0x80, 0x01, 0x00, 0xFE, 0xFF, 0x00, 0x01, 0xFF, 0x7F, 0x55});
    EXPECT_EQ(decoded("qwaNCParams", block, 0), -32768);
    EXPECT_EQ(decoded("qwaNCParams", block, 1), 1);
    EXPECT_EQ(decoded("qwaNCParams", block, 2), -2);
    EXPECT_EQ(decoded("qwaNCParams", block, 3), 256);
    EXPECT_EQ(decoded("qwaNCParams", block, 4), 32767);
    EXPECT_EQ(decoded("qwaMEQEnable", blockWith(177, {0x2C, 0x01}), 3), 300);
    EXPECT_EQ(decoded("qwaSendParamEQNodes", blockWith(164, {0x39, 0x30}), 14), 12345);
}

TEST(QwaWordTest, TablesHoldThreeWordsEach) {
    const QwaWord switches[] = {{1, "qwaOff"}, {2, "qwaOn"}, {3, "qwaIdle"}};
    const QwaWord modes[] = {{1, "qwaSingleChannel"}, {2, "qwaMultiChannel"}, {3, "qwaCombined"}};
    for (std::size_t i = 0; i < 3; ++i) {
        EXPECT_EQ(qwaSwitchWords.at(i).code, switches[i].code);
        EXPECT_STREQ(qwaSwitchWords.at(i).word, switches[i].word);
        EXPECT_EQ(qwaModeWords.at(i).code, modes[i].code);
        EXPECT_STREQ(qwaModeWords.at(i).word, modes[i].word);
    }
}

// Rules: TUN-12, TUN-13
TEST(QwaWordTest, CodesOneToThreeHaveAWord) {
    EXPECT_STREQ(qwaWord(qwaSwitchWords, 1), "qwaOff");
    EXPECT_STREQ(qwaWord(qwaSwitchWords, 2), "qwaOn");
    EXPECT_STREQ(qwaWord(qwaSwitchWords, 3), "qwaIdle");
    EXPECT_STREQ(qwaWord(qwaModeWords, 1), "qwaSingleChannel");
    EXPECT_STREQ(qwaWord(qwaModeWords, 2), "qwaMultiChannel");
    EXPECT_STREQ(qwaWord(qwaModeWords, 3), "qwaCombined");
}

// Rules: TUN-14
TEST(QwaWordTest, OtherCodesHaveNoWord) {
    for (const std::int32_t code :
         {0, 4, -1, -2, -3, 6, 255, 256, 257, 258, 259, 0x10001, INT_MAX, INT_MIN}) {
        EXPECT_STREQ(qwaWord(qwaSwitchWords, code), "") << code;
        EXPECT_STREQ(qwaWord(qwaModeWords, code), "") << code;
    }
}

} // namespace
} // namespace orvane::test
