// SPDX-License-Identifier: Apache-2.0
#include "kit/host/kit_error.h"
#include "kit/tuning/tuning_encode.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <string>
#include <vector>

namespace orvane::test {

namespace {

using kit::TuningValue;
using Numbers = std::vector<std::int64_t>;

DpsBlock blockOf(std::uint8_t byte) {
    DpsBlock block{};
    block.bytes.fill(byte);
    return block;
}

/// A block in which exactly the bits of `field` are set.
DpsBlock bitsOf(const DpsField& field) {
    DpsBlock mask{};
    if (field.encoding == DpsEncoding::code2) {
        mask.bytes.at(field.offset) = static_cast<std::uint8_t>(3U << field.bit);
        return mask;
    }
    const std::size_t width = field.encoding == DpsEncoding::i16 ? 2 : 1;
    std::fill_n(mask.bytes.begin() + field.offset, width * field.count, std::uint8_t{0xFF});
    return mask;
}

void expectOthersUntouched(const DpsBlock& before, const DpsBlock& after, const DpsField& field) {
    const DpsBlock mask = bitsOf(field);
    for (std::size_t at = 0; at < DPS_BLOCK_SIZE; ++at) {
        EXPECT_EQ((before.bytes.at(at) ^ after.bytes.at(at)) & ~unsigned{mask.bytes.at(at)}, 0U)
            << "byte " << at;
    }
}

/// Numbers that distinguish every bit of an element, and its sign, from its neighbours.
Numbers numbersFor(DpsEncoding encoding) {
    switch (encoding) {
    case DpsEncoding::code2:
        return {0, 1, 2, 3};
    case DpsEncoding::u8:
        return {0, 1, 2, 0x55, 0xAA, 127, 128, 255};
    case DpsEncoding::i16:
        break;
    }
    return {0, 1, -1, 255, 256, -256, 0x1234, 0x5A5A, -0x1235, 32767, -32768};
}

/// `count` elements, all different if there are enough numbers.
Numbers listFrom(const Numbers& numbers, std::size_t first, std::size_t count) {
    Numbers list;
    for (std::size_t i = 0; i < count; ++i) {
        list.push_back(numbers.at((first + i) % numbers.size()));
    }
    return list;
}

TEST(TuningEncode, EveryFieldDecodesToWhatWasEncodedAndTouchesNoOtherBit) {
    for (const DpsField& field : DPS_LAYOUT) {
        SCOPED_TRACE(field.key);
        const Numbers numbers = numbersFor(field.encoding);
        for (std::size_t first = 0; first < numbers.size(); ++first) {
            const Numbers list = listFrom(numbers, first, field.count);
            const TuningValue value =
                field.kind == DpsKind::list ? TuningValue(list) : TuningValue(list.front());
            for (const int background : {0x00, 0xFF, 0xA5}) {
                const DpsBlock before = blockOf(static_cast<std::uint8_t>(background));
                DpsBlock block = before;
                kit::encodeTuningField(block, field.key, value);
                for (std::size_t element = 0; element < field.count; ++element) {
                    EXPECT_EQ(decodeField(block, field, element), list.at(element)) << element;
                }
                expectOthersUntouched(before, block, field);
            }
        }
    }
}

TEST(TuningEncode, EveryWordOfASwitchIsItsCode) {
    for (const DpsField& field : DPS_LAYOUT) {
        if (field.kind != DpsKind::switchWord) {
            continue;
        }
        SCOPED_TRACE(field.key);
        DpsBlock block = blockOf(0xFF);
        kit::encodeTuningField(block, field.key, "qwaOff");
        EXPECT_EQ(decodeField(block, field, 0), 1);
        kit::encodeTuningField(block, field.key, "qwaOn");
        EXPECT_EQ(decodeField(block, field, 0), 2);
        kit::encodeTuningField(block, field.key, "qwaIdle");
        EXPECT_EQ(decodeField(block, field, 0), 3);
    }
}

TEST(TuningEncode, EveryWordOfTheModeIsItsCode) {
    const DpsField& mode = kit::tuningField("qwaWNDBMode");
    DpsBlock block{};
    kit::encodeTuningField(block, mode.key, "qwaSingleChannel");
    EXPECT_EQ(decodeField(block, mode, 0), 1);
    kit::encodeTuningField(block, mode.key, "qwaMultiChannel");
    EXPECT_EQ(decodeField(block, mode, 0), 2);
    kit::encodeTuningField(block, mode.key, "qwaCombined");
    EXPECT_EQ(decodeField(block, mode, 0), 3);
}

TEST(TuningEncode, FieldIsFoundByItsWholeKeyOnly) {
    for (const DpsField& field : DPS_LAYOUT) {
        EXPECT_EQ(&kit::tuningField(field.key), &field);
    }
    for (const char* key :
         {"", "qwa", "qwaAECSwitc", "qwaAECSwitchs", "qwaaecswitch", "AECSwitch"}) {
        EXPECT_THROW(kit::tuningField(key), kit::KitError) << key;
    }
}

struct Refusal {
    const char* key;
    TuningValue value;
    const char* message;
};

const Refusal REFUSALS[] = {
    {"qwaNone", std::int64_t{1}, "there is no tuning field \"qwaNone\""},
    {"qwaAECSwitch", "on",
     "qwaAECSwitch has no word \"on\": it takes qwaOff, qwaOn, qwaIdle, or a code 0 to 3"},
    {"qwaWNDBSwitch", "qwaON",
     "qwaWNDBSwitch has no word \"qwaON\": it takes qwaOff, qwaOn, qwaIdle, or a code 0 to 255"},
    {"qwaAECSwitch", "qwaCombined",
     "qwaAECSwitch has no word \"qwaCombined\": it takes qwaOff, qwaOn, qwaIdle, or a code 0 to 3"},
    {"qwaWNDBMode", "qwaOn",
     "qwaWNDBMode has no word \"qwaOn\": it takes qwaSingleChannel, qwaMultiChannel, qwaCombined, "
     "or a code 0 to 3"},
    {"qwaRecvGain", "qwaOn", "qwaRecvGain takes numbers, not the word \"qwaOn\""},
    {"qwaMEQEnable", "qwaOn", "qwaMEQEnable takes numbers, not the word \"qwaOn\""},
    {"qwaAECSwitch", std::int64_t{4}, "qwaAECSwitch takes 0 to 3: 4 does not fit"},
    {"qwaAECSwitch", std::int64_t{-1}, "qwaAECSwitch takes 0 to 3: -1 does not fit"},
    {"qwaHFEExtent", std::int64_t{256}, "qwaHFEExtent takes 0 to 255: 256 does not fit"},
    {"qwaHFEExtent", std::int64_t{-1}, "qwaHFEExtent takes 0 to 255: -1 does not fit"},
    {"qwaNRAtten", std::int64_t{32768}, "qwaNRAtten takes -32768 to 32767: 32768 does not fit"},
    {"qwaNRAtten", std::int64_t{-32769}, "qwaNRAtten takes -32768 to 32767: -32769 does not fit"},
    {"qwaNRAtten", std::int64_t{1} << 32,
     "qwaNRAtten takes -32768 to 32767: 4294967296 does not fit"},
    {"qwaNRAtten", Numbers{1}, "qwaNRAtten takes one value, not a list"},
    {"qwaAECSwitch", Numbers{1}, "qwaAECSwitch takes one value, not a list"},
    {"qwaNCParams", std::int64_t{1}, "qwaNCParams takes a list of 5 numbers, not 1"},
    {"qwaNCParams", Numbers{1, 2, 3, 4}, "qwaNCParams takes 5 numbers, not 4"},
    {"qwaNCParams", Numbers{1, 2, 3, 4, 5, 6}, "qwaNCParams takes 5 numbers, not 6"},
    {"qwaNCParams", Numbers{}, "qwaNCParams takes 5 numbers, not 0"},
    {"qwaNCParams", Numbers{1, 2, 3, 4, 32768},
     "qwaNCParams takes -32768 to 32767: 32768 does not fit"},
};

TEST(TuningEncode, RefusalNamesWhatWouldBeRightAndKeepsTheBlock) {
    for (const Refusal& refusal : REFUSALS) {
        SCOPED_TRACE(refusal.message);
        DpsBlock block = blockOf(0xA5);
        try {
            kit::encodeTuningField(block, refusal.key, refusal.value);
            ADD_FAILURE() << "accepted";
        } catch (const kit::KitError& error) {
            EXPECT_STREQ(error.what(), refusal.message);
        }
        EXPECT_EQ(block.bytes, blockOf(0xA5).bytes);
    }
}

TEST(TuningEncode, BlockIsItsRawBytesThenZerosThenItsFields) {
    const DpsBlock block = kit::encodeTuningBlock(
        {std::string(12, '\xFF'),
         {{"qwaAGCSwitch", std::int64_t{0}}, {"qwaNCParams", Numbers{1, -2, 0, 0, 256}}}});
    DpsBlock expected{};
    std::fill_n(expected.bytes.begin(), 12, std::uint8_t{0xFF});
    expected.bytes[0] = 0xF3;  // the second pair of bits
    expected.bytes[13] = 0x01; // five values from byte 13 on
    expected.bytes[15] = 0xFE;
    expected.bytes[16] = 0xFF;
    expected.bytes[22] = 0x01;
    EXPECT_EQ(block.bytes, expected.bytes);
}

TEST(TuningEncode, EmptyBlockIsZeros) {
    EXPECT_EQ(kit::encodeTuningBlock({}).bytes, blockOf(0).bytes);
}

TEST(TuningEncode, RawBytesFillAWholeBlockAndNoMore) {
    EXPECT_EQ(kit::encodeTuningBlock({std::string(188, '\x7F'), {}}).bytes, blockOf(0x7F).bytes);
    EXPECT_THROW(kit::encodeTuningBlock({std::string(189, '\x7F'), {}}), kit::KitError);
}

TEST(TuningEncode, BlockRefusesWhatItsFieldsRefuse) {
    EXPECT_THROW(kit::encodeTuningBlock({"", {{"qwaNone", std::int64_t{1}}}}), kit::KitError);
    EXPECT_THROW(kit::encodeTuningBlock({"", {{"qwaRecvGain", "qwaOn"}}}), kit::KitError);
}

} // namespace

} // namespace orvane::test
