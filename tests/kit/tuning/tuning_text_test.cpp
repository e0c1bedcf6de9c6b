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

/// The block as its file shows it: codes without a word and unread bits are 0.
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

TEST(TuningText, OutputOfTheToolIsReadBack) {
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

constexpr char HEADER[] = "; Genereated config from DPS (blockId 3)";

/// A first line in place of the header, the column where it differs, and what the tool would write.
struct HeaderRefusal {
    const char* line;
    const char* column;
    const char* written;
};

TEST(TuningText, HeaderOfAnotherFormIsRefused) {
    const HeaderRefusal refusals[] = {
        {"", "1", HEADER},
        {"; Generated config from DPS (blockId 3)", "8", HEADER},
        {"; Genereated config from DPS (blockId 10)", "40",
         "; Genereated config from DPS (blockId 1)"},
        {"; Genereated config from DPS (blockId )", "39", HEADER},
        {"; Genereated config from DPS (blockId 3) ", "41", HEADER},
        {" ; Genereated config from DPS (blockId 3)", "1", HEADER},
        {"; Genereated config from DPS (blockId a)", "39", HEADER},
        {"; Genereated config from DPS (blockId -1)", "39", HEADER},
        {"; Genereated config from DPS (blockId 3", "40", HEADER},
        {"; Genereated config from DPS (blockId 3)\r", "41", HEADER},
    };
    for (const HeaderRefusal& refusal : refusals) {
        const std::string line = refusal.line;
        const std::string shown = line.substr(0, line.find('\r'));
        EXPECT_EQ(refusalOf(replaced(zeroText(), HEADER, line)),
                  std::string("a.txt:1:") + refusal.column + ": orvane writes \"" +
                      refusal.written + "\" here, not \"" + shown +
                      (shown == line ? "\"" : "\\x0d\""));
    }
    EXPECT_EQ(refusalOf(replaced(zeroText(), std::string(HEADER) + "\n", "")),
              std::string("a.txt:1:1: orvane writes \"") + HEADER +
                  "\" here, not \"qwaAECSwitch \"");
}

/// A replaced part of the zero text, and the message about the result.
struct Refusal {
    const char* part;
    const char* other;
    const char* message;
};

const Refusal REFUSALS[] = {
    {"qwaAECSwitch \n", "qwaAECSwitch on\n",
     "a.txt:2:14: qwaAECSwitch has no word \"on\": it takes qwaOff, qwaOn, qwaIdle, or a code 0 to "
     "3"},
    {"qwaAECSwitch \n", "qwaAECSwitch 1\n",
     "a.txt:2:14: orvane writes \"qwaAECSwitch qwaOff\" here, not \"qwaAECSwitch 1\""},
    {"qwaAECSwitch \n", "qwaAECSwitch 4\n",
     "a.txt:2:14: qwaAECSwitch takes 0 to 3: 4 does not fit"},
    {"qwaAECSwitch \n", "qwaAECSwitch qwaOn \n",
     "a.txt:2:19: orvane writes \"qwaAECSwitch qwaOn\" here, not \"qwaAECSwitch qwaOn \""},
    {"qwaWNDBMode \n", "qwaWNDBMode qwaOn\n",
     "a.txt:18:13: qwaWNDBMode has no word \"qwaOn\": it takes qwaSingleChannel, qwaMultiChannel, "
     "qwaCombined, or a code 0 to 3"},
    {"qwaAECSwitch \n", "qwaAECSwitch\n",
     "a.txt:2:13: orvane writes \"qwaAECSwitch \" here, not \"qwaAECSwitch\""},
    {"qwaAECSwitch \n", "qwaAECSwitch \r\n",
     "a.txt:2:14: orvane writes \"qwaAECSwitch \" here, not \"qwaAECSwitch \\x0d\""},
    {"qwaAECSwitch \n", "qwaAECSwitch\r\n",
     "a.txt:2:13: orvane writes \"qwaAECSwitch \" here, not \"qwaAECSwitch\\x0d\""},
    {"qwaAECSwitch \n", " qwaAECSwitch \n",
     "a.txt:2:1: orvane writes \"qwaAECSwitch \" here, not \" qwaAECSwitch \""},
    {"qwaHFEExtent 0\n", "qwaHFEExtent 256\n",
     "a.txt:22:16: qwaHFEExtent takes 0 to 255: 256 does not fit"},
    {"qwaHFEExtent 0\n", "qwaHFEExtent -1\n",
     "a.txt:22:14: qwaHFEExtent takes 0 to 255: -1 does not fit"},
    {"qwaNRAtten 0\n", "qwaNRAtten 32768\n",
     "a.txt:24:16: qwaNRAtten takes -32768 to 32767: 32768 does not fit"},
    {"qwaNRAtten 0\n", "qwaNRAtten 99999999999999999999\n",
     "a.txt:24:12: qwaNRAtten takes -32768 to 32767: 9223372036854775807 does not fit"},
    {"qwaNRAtten 0\n", "qwaNRAtten \n",
     "a.txt:24:12: orvane writes \"qwaNRAtten 0\" here, not \"qwaNRAtten \""},
    {"qwaNRAtten 0\n", "qwaNRAtten 0 \n",
     "a.txt:24:13: orvane writes \"qwaNRAtten 0\" here, not \"qwaNRAtten 0 \""},
    {"qwaNRAtten 0\n", "qwaNRAtten 0 7\n",
     "a.txt:24:13: orvane writes \"qwaNRAtten 0\" here, not \"qwaNRAtten 0 7\""},
    {"qwaNRAtten 0\n", "qwaNRAtten 00\n",
     "a.txt:24:13: orvane writes \"qwaNRAtten 0\" here, not \"qwaNRAtten 00\""},
    {"qwaNRAtten 0\n", "qwaNRAtten -0\n",
     "a.txt:24:12: orvane writes \"qwaNRAtten 0\" here, not \"qwaNRAtten -0\""},
    {"qwaNRAtten 0\n", "qwaNRAtten +1\n",
     "a.txt:24:12: qwaNRAtten takes numbers, not the word \"+1\""},
    {"qwaNRAtten 0\n", "qwaNRAtten 0x1\n",
     "a.txt:24:13: qwaNRAtten takes numbers, not the word \"0x1\""},
    {"qwaNRAtten 0\n", "qwaNRAtten  1\n",
     "a.txt:24:12: orvane writes \"qwaNRAtten 1\" here, not \"qwaNRAtten  1\""},
    {"qwaNCParams 0 0 0 0 0 \n", "qwaNCParams 0 0 0 0 0\n",
     "a.txt:23:22: orvane writes \"qwaNCParams 0 0 0 0 0 \" here, not \"qwaNCParams 0 0 0 0 0\""},
    {"qwaNCParams 0 0 0 0 0 \n", "qwaNCParams 1 2 3 4 \n",
     "a.txt:23:21: qwaNCParams takes 5 numbers, not 4"},
    {"qwaNCParams 0 0 0 0 0 \n", "qwaNCParams 1 2 3 4 5 6 \n",
     "a.txt:23:23: qwaNCParams takes 5 numbers, not 6"},
    {"qwaNCParams 0 0 0 0 0 \n", "qwaNCParams \n",
     "a.txt:23:13: qwaNCParams takes 5 numbers, not 0"},
    {"qwaNCParams 0 0 0 0 0 \n", "qwaNCParams 0 0  0 0 0 \n",
     "a.txt:23:17: orvane writes \"qwaNCParams 0 0 0 0 0 \" here, not \"qwaNCParams 0 0  0 0 0 \""},
    {"qwaNCParams 0 0 0 0 0 \n", "qwaNCParams 1,2,3,4,5 \n",
     "a.txt:23:13: qwaNCParams takes numbers, not the word \"1,2,3,4,5\""},
    {"qwaNCParams 0 0 0 0 0 \n", "qwaNCParams 1 2 x 4 5 \n",
     "a.txt:23:17: qwaNCParams takes numbers, not the word \"x\""},
    {"qwaNCParams 0 0 0 0 0 \n", "qwaNCParams 1 2 3 -32769 5 \n",
     "a.txt:23:24: qwaNCParams takes -32768 to 32767: -32769 does not fit"},
    {"qwaNRAtten 0\n", "",
     "a.txt:24:4: orvane writes \"qwaNRAtten 0\" here, not \"qwaRECSuppress 0\""},
    {"qwaNRAtten 0\n", "qwaNRAtten 0\n\n",
     "a.txt:25:1: orvane writes \"qwaRECSuppress 0\" here, not \"\""},
    {"qwaNRAtten 0\n", "qwaNRAtten 0\nqwaNone 1\n",
     "a.txt:25:4: orvane writes \"qwaRECSuppress 0\" here, not \"qwaNone 1\""},
    {"qwaNRAtten 0\n", "qwaNRAtten 0\n; a comment\n",
     "a.txt:25:1: orvane writes \"qwaRECSuppress 0\" here, not \"; a comment\""},
    {"qwaNRAtten 0\n", "qwaNRAtten 0\n\x01\x7F 1\n",
     "a.txt:25:1: orvane writes \"qwaRECSuppress 0\" here, not \"\\x01\\x7f 1\""},
    {"qwaNRAtten 0\n", "qwaNRAtten 0\nqwaNRAtten 7\n",
     "a.txt:25:4: orvane writes \"qwaRECSuppress 0\" here, not \"qwaNRAtten 7\""},
    {"qwaNRAtten 0\nqwaRECSuppress 0\n", "qwaRECSuppress 0\nqwaNRAtten 0\n",
     "a.txt:24:4: orvane writes \"qwaNRAtten 0\" here, not \"qwaRECSuppress 0\""},
    {"qwaMEQEnable 0 0 0 0 \n", "qwaMEQEnable 0 0 0 0 ",
     "a.txt:45:22: the last line has no line end"},
    {"qwaMEQEnable 0 0 0 0 \n", "qwaMEQEnable 0 0",
     "a.txt:45:17: qwaMEQEnable takes 4 numbers, not 2"},
    {"qwaMEQEnable 0 0 0 0 \n", "",
     "a.txt:45:1: the text ends here: orvane writes \"qwaMEQEnable 0 0 0 0 \""},
    {"qwaMEQEnable 0 0 0 0 \n", "qwaMEQEnable 0 0 0 0 \nmore",
     "a.txt:46:1: orvane does not write \"more\""},
};

TEST(TuningText, TextThatTheToolWouldNotWriteIsRefusedWithItsPlace) {
    for (const Refusal& refusal : REFUSALS) {
        SCOPED_TRACE(refusal.message);
        EXPECT_EQ(refusalOf(replaced(zeroText(), refusal.part, refusal.other)), refusal.message);
    }
}

TEST(TuningText, FirstFaultIsReported) {
    std::string text = replaced(zeroText(), "qwaHFEExtent 0\n", "qwaHFEExtent 256\nqwaNone 1\n");
    text = replaced(text, "qwaNRAtten 0\n", "");
    EXPECT_EQ(refusalOf(text), "a.txt:22:16: qwaHFEExtent takes 0 to 255: 256 does not fit");
    EXPECT_EQ(refusalOf(replaced(text, "qwaAECSwitch \n", "qwaAECSwitch on\n")),
              "a.txt:2:14: qwaAECSwitch has no word \"on\": it takes qwaOff, qwaOn, qwaIdle, or a "
              "code 0 to 3");
}

TEST(TuningText, EmptyTextHasNoHeader) {
    EXPECT_EQ(refusalOf(""),
              std::string("a.txt:1:1: the text ends here: orvane writes \"") + HEADER + '"');
}

TEST(TuningText, LongLineIsShownInPart) {
    EXPECT_EQ(refusalOf(std::string(1000, 'x')), std::string("a.txt:1:1: orvane writes \"") +
                                                     HEADER + "\" here, not \"" +
                                                     std::string(DPS_LINE_MAX, 'x') + "\"...");
}

TEST(TuningText, EveryPrefixOfAFileIsRefused) {
    const std::string text = textOf(RandomUnit(1).block(), 3);
    for (std::size_t length = 0; length < text.size(); ++length) {
        EXPECT_NE(refusalOf(text.substr(0, length)), "") << length;
    }
}

} // namespace

} // namespace orvane::test
