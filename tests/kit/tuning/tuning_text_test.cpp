// SPDX-License-Identifier: Apache-2.0
#include "kit/host/kit_error.h"
#include "kit/tuning/tuning_encode.h"
#include "kit/tuning/tuning_text.h"
#include "tests/kit/description/random_unit.h"
#include "tuning/tuning_file.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <sstream>
#include <string>

namespace orvane::test {

namespace {

std::string textOf(const DpsBlock& block, std::int32_t id) {
    std::ostringstream text;
    writeTuningText(text, id, block);
    return text.str();
}

/// The tuning file of a block of zeros: line 2 is qwaAECSwitch, line 45 is qwaMEQEnable.
std::string zeroText() {
    return textOf({}, 3);
}

std::string refusalOf(const std::string& text) {
    try {
        kit::parseTuningText(text, "a.txt", 3);
    } catch (const kit::KitError& error) {
        return error.what();
    }
    return "";
}

std::string replaced(std::string text, const std::string& part, const std::string& other) {
    const std::size_t at = text.find(part);
    EXPECT_NE(at, std::string::npos) << part;
    return text.replace(at, part.size(), other);
}

/// What a code without a word becomes, and what no field reads.
DpsBlock asTheFileShowsIt(const DpsBlock& block) {
    DpsBlock shown{};
    for (const DpsField& field : DPS_LAYOUT) {
        std::vector<std::int64_t> numbers;
        for (std::size_t element = 0; element < field.count; ++element) {
            numbers.push_back(decodeField(block, field, element));
        }
        const bool isWord = field.kind == DpsKind::switchWord || field.kind == DpsKind::modeWord;
        if (isWord && (numbers[0] < 1 || numbers[0] > 3)) {
            numbers[0] = 0;
        }
        kit::encodeTuningField(shown, field.key,
                               field.kind == DpsKind::list ? kit::TuningValue(numbers)
                                                           : kit::TuningValue(numbers[0]));
    }
    return shown;
}

TEST(TuningText, WhatTheToolWritesIsReadBack) {
    for (std::uint32_t seed = 0; seed < 300; ++seed) {
        const DpsBlock block = RandomUnit(seed).block();
        const std::string text = textOf(block, static_cast<std::int32_t>(seed % 10));
        const DpsBlock read = kit::parseTuningText(text, "a.txt", 3);
        ASSERT_EQ(read.bytes, asTheFileShowsIt(block).bytes) << seed;
        ASSERT_EQ(textOf(read, static_cast<std::int32_t>(seed % 10)), text) << seed;
    }
}

TEST(TuningText, HandWrittenLinesAreRead) {
    std::string text = zeroText();
    text = replaced(text, "qwaAECSwitch \n", "qwaAECSwitch qwaIdle\n");
    text = replaced(text, "qwaWNDBMode \n", "qwaWNDBMode qwaMultiChannel\n");
    text = replaced(text, "qwaLFRSwitch \n", "qwaLFRSwitch qwaOff\n");
    text = replaced(text, "qwaHFEExtent 0\n", "qwaHFEExtent 255\n");
    text = replaced(text, "qwaNCParams 0 0 0 0 0 \n", "qwaNCParams 1 -2 3 32767 -32768 \n");
    DpsBlock expected{};
    expected.bytes[0] = 3;
    expected.bytes[4] = 2 << 6;
    expected.bytes[8] = 1;
    expected.bytes[10] = 255;
    const std::uint8_t list[] = {1, 0, 0xFE, 0xFF, 3, 0, 0xFF, 0x7F, 0x00, 0x80};
    std::copy(std::begin(list), std::end(list), expected.bytes.begin() + 13);
    EXPECT_EQ(kit::parseTuningText(text, "a.txt", 3).bytes, expected.bytes);
}

TEST(TuningText, HeaderMayBeOfAnyBlock) {
    for (std::int32_t id = 0; id < 10; ++id) {
        EXPECT_EQ(refusalOf(textOf({}, id)), "") << id;
    }
}

constexpr char HEADER_WANTED[] = "a.txt:1:1: the first line must be \"; Genereated config from DPS "
                                 "(blockId 3)\", or that of another block from 0 to 9";

TEST(TuningText, HeaderOfAnotherFormIsRefused) {
    for (const char* header :
         {"", "; Generated config from DPS (blockId 3)",
          "; Genereated config from DPS (blockId 10)", "; Genereated config from DPS (blockId )",
          "; Genereated config from DPS (blockId 3) ", " ; Genereated config from DPS (blockId 3)",
          "; Genereated config from DPS (blockId a)", "; Genereated config from DPS (blockId -1)",
          "; Genereated config from DPS (blockId 3"}) {
        EXPECT_EQ(
            refusalOf(replaced(zeroText(), "; Genereated config from DPS (blockId 3)", header)),
            HEADER_WANTED)
            << header;
    }
    EXPECT_EQ(refusalOf(replaced(zeroText(), "; Genereated config from DPS (blockId 3)\n", "")),
              HEADER_WANTED);
}

/// A part of the zero text that is replaced, and what is said of the result.
struct Refusal {
    const char* part;
    const char* other;
    const char* message;
};

const Refusal REFUSALS[] = {
    {"qwaAECSwitch \n", "qwaAECSwitch on\n",
     "a.txt:2:14: qwaAECSwitch has no word \"on\": it takes qwaOff, qwaOn, qwaIdle, or nothing"},
    {"qwaAECSwitch \n", "qwaAECSwitch 1\n",
     "a.txt:2:14: qwaAECSwitch has no word \"1\": it takes qwaOff, qwaOn, qwaIdle, or nothing"},
    {"qwaAECSwitch \n", "qwaAECSwitch qwaOn \n",
     "a.txt:2:14: qwaAECSwitch has no word \"qwaOn \": it takes qwaOff, qwaOn, qwaIdle, or "
     "nothing"},
    {"qwaWNDBMode \n", "qwaWNDBMode qwaOn\n",
     "a.txt:18:13: qwaWNDBMode has no word \"qwaOn\": it takes qwaSingleChannel, qwaMultiChannel, "
     "qwaCombined, or nothing"},
    {"qwaAECSwitch \n", "qwaAECSwitch\n",
     "a.txt:2:13: qwaAECSwitch takes a blank behind it, whatever follows"},
    {"qwaAECSwitch \n", "qwaAECSwitch \r\n",
     "a.txt:2:14: a line ends with a line feed alone, not a carriage return"},
    {"qwaAECSwitch \n", "qwaAECSwitch\r\n",
     "a.txt:2:13: a line ends with a line feed alone, not a carriage return"},
    {"(blockId 3)\n", "(blockId 3)\r\n",
     "a.txt:1:41: a line ends with a line feed alone, not a carriage return"},
    {"qwaHFEExtent 0\n", "qwaHFEExtent 256\n",
     "a.txt:22:14: qwaHFEExtent takes 0 to 255: 256 does not fit"},
    {"qwaHFEExtent 0\n", "qwaHFEExtent -1\n",
     "a.txt:22:14: qwaHFEExtent takes 0 to 255: -1 does not fit"},
    {"qwaNRAtten 0\n", "qwaNRAtten 32768\n",
     "a.txt:24:12: qwaNRAtten takes -32768 to 32767: 32768 does not fit"},
    {"qwaNRAtten 0\n", "qwaNRAtten 99999999999999999999\n",
     "a.txt:24:12: qwaNRAtten takes -32768 to 32767: 99999999999999999999 does not fit"},
    {"qwaNRAtten 0\n", "qwaNRAtten \n", "a.txt:24:12: qwaNRAtten takes a decimal number, not \"\""},
    {"qwaNRAtten 0\n", "qwaNRAtten 0 \n",
     "a.txt:24:12: qwaNRAtten takes a decimal number, not \"0 \""},
    {"qwaNRAtten 0\n", "qwaNRAtten 00\n",
     "a.txt:24:12: qwaNRAtten takes a decimal number, not \"00\""},
    {"qwaNRAtten 0\n", "qwaNRAtten -0\n",
     "a.txt:24:12: qwaNRAtten takes a decimal number, not \"-0\""},
    {"qwaNRAtten 0\n", "qwaNRAtten +1\n",
     "a.txt:24:12: qwaNRAtten takes a decimal number, not \"+1\""},
    {"qwaNRAtten 0\n", "qwaNRAtten 0x1\n",
     "a.txt:24:12: qwaNRAtten takes a decimal number, not \"0x1\""},
    {"qwaNRAtten 0\n", "qwaNRAtten  1\n",
     "a.txt:24:12: qwaNRAtten takes a decimal number, not \" 1\""},
    {"qwaNCParams 0 0 0 0 0 \n", "qwaNCParams 0 0 0 0 0\n",
     "a.txt:23:22: qwaNCParams takes a blank behind its last number, too"},
    {"qwaNCParams 0 0 0 0 0 \n", "qwaNCParams 0 0 0 0 \n",
     "a.txt:23:13: qwaNCParams takes 5 numbers, not 4"},
    {"qwaNCParams 0 0 0 0 0 \n", "qwaNCParams 0 0 0 0 0 0 \n",
     "a.txt:23:13: qwaNCParams takes 5 numbers, not 6"},
    {"qwaNCParams 0 0 0 0 0 \n", "qwaNCParams \n",
     "a.txt:23:13: qwaNCParams takes 5 numbers, not 0"},
    {"qwaNCParams 0 0 0 0 0 \n", "qwaNCParams 0 0  0 0 \n",
     "a.txt:23:17: qwaNCParams takes a decimal number, not \"\""},
    {"qwaNCParams 0 0 0 0 0 \n", "qwaNCParams 0,0,0,0,0 \n",
     "a.txt:23:13: qwaNCParams takes a decimal number, not \"0,0,0,0,0\""},
    {"qwaNCParams 0 0 0 0 0 \n", "qwaNCParams 0 0 0 -32769 0 \n",
     "a.txt:23:19: qwaNCParams takes -32768 to 32767: -32769 does not fit"},
    {"qwaNRAtten 0\n", "", "a.txt:45:1: there is no line of qwaNRAtten"},
    {"qwaNRAtten 0\nqwaRECSuppress 0\n", "",
     "a.txt:44:1: there is no line of qwaNRAtten, qwaRECSuppress"},
    {"qwaNRAtten 0\n", "qwaNRAtten 0\n\n", "a.txt:25:1: unknown key \"\""},
    {"qwaNRAtten 0\n", "qwaNRAtten 0\nqwaNone 1\n", "a.txt:25:1: unknown key \"qwaNone\""},
    {"qwaNRAtten 0\n", "qwaNRAtten 0\n; a comment\n", "a.txt:25:1: unknown key \";\""},
    {"qwaNRAtten 0\n", "qwaNRAtten 0\n\x01\x7F 1\n", "a.txt:25:1: unknown key \"\\x01\\x7f\""},
    {"qwaNRAtten 0\n", "qwaNRAtten 0\nqwaNRAtten 0\n", "a.txt:25:1: qwaNRAtten is there already"},
    {"qwaNRAtten 0\nqwaRECSuppress 0\n", "qwaRECSuppress 0\nqwaNRAtten 0\n",
     "a.txt:25:1: qwaNRAtten must stand before qwaRECSuppress"},
    {"qwaMEQEnable 0 0 0 0 \n", "qwaMEQEnable 0 0 0 0 ",
     "a.txt:45:22: the last line has no line end"},
};

TEST(TuningText, WhatTheToolDoesNotWriteIsRefusedWithItsPlace) {
    for (const Refusal& refusal : REFUSALS) {
        SCOPED_TRACE(refusal.message);
        EXPECT_EQ(refusalOf(replaced(zeroText(), refusal.part, refusal.other)), refusal.message);
    }
}

TEST(TuningText, EveryFaultIsALine) {
    std::string text = replaced(zeroText(), "qwaAECSwitch \n", "qwaAECSwitch on\n");
    text = replaced(text, "qwaHFEExtent 0\n", "qwaHFEExtent 256\nqwaNone 1\n");
    text = replaced(text, "qwaNRAtten 0\n", "");
    EXPECT_EQ(refusalOf(text),
              "a.txt:2:14: qwaAECSwitch has no word \"on\": it takes qwaOff, qwaOn, qwaIdle, or "
              "nothing\n"
              "a.txt:22:14: qwaHFEExtent takes 0 to 255: 256 does not fit\n"
              "a.txt:23:1: unknown key \"qwaNone\"\n"
              "a.txt:46:1: there is no line of qwaNRAtten");
}

TEST(TuningText, EmptyTextHasNoHeaderAndNoLine) {
    const std::string refusal = refusalOf("");
    EXPECT_EQ(refusal.rfind(HEADER_WANTED, 0), 0U) << refusal;
    EXPECT_NE(refusal.find("\na.txt:1:1: there is no line of qwaAECSwitch, qwaAGCSwitch, "),
              std::string::npos)
        << refusal;
}

TEST(TuningText, EveryBeginningOfAFileIsRefused) {
    const std::string text = textOf(RandomUnit(1).block(), 3);
    for (std::size_t length = 0; length < text.size(); ++length) {
        EXPECT_NE(refusalOf(text.substr(0, length)), "") << length;
    }
}

} // namespace

} // namespace orvane::test
