// SPDX-License-Identifier: Apache-2.0
#include "kit/description/description_text.h"
#include "kit/description/parse_description.h"
#include "kit/description/toml_text.h"
#include "kit/host/text.h"
#include "tests/kit/description/description_equality.h"
#include "tests/kit/description/random_unit.h"
#include "tests/support/unicode.h"

#include <gtest/gtest.h>

#include <string>
#include <string_view>

namespace orvane::test {

namespace {

/// A unit with an entry of each kind, and its text.
kit::UnitDescription wholeUnit() {
    kit::UnitDescription unit;
    unit.folders = {"/new", "/\xFF"};
    unit.absent = {"/dev/x"};
    unit.image.size = 300;
    unit.image.params = {{134, 0xFFFF}, {22, 1}};
    unit.image.bytes = {{250, "A\xFF"}, {181, std::string(33, '\x01')}};
    unit.disk.size = 2000000;
    unit.disk.aux = "bench 2";
    unit.disk.slots = {{10, "\x01"}, {9, "SN004217"}, {2, "hex:4"}};
    unit.disk.tuning[3] = {"\xE4",
                           {{"qwaSendGain", std::int64_t{-7}},
                            {"qwaAECSwitch", "qwaOn"},
                            {"qwaRecvAGCAmpTgts", std::vector<std::int64_t>{1, -2}}}};
    unit.disk.tuning[0] = {};
    unit.disk.bytes = {{1500000, "x"}, {9, "y"}};
    unit.files = {{"/a", "one line\n"},
                  {"/b", "two \"lines\"\r\n\tand \\ \"\"\"\n"},
                  {"/c", "\xFF"},
                  {"/d", std::string(64, 'x')},
                  {"/e", std::string(65, '\0')},
                  {"/f", ""},
                  {"/g", "a\nb\""}};
    unit.sparseFiles = {{"/s", {4096, {{4095, "z"}}}}, {"/t", {1, {}}}};
    unit.links = {{"/l", "../x"}, {"/m", "hex:"}};
    return unit;
}

constexpr char WHOLE_TEXT[] = R"(folders = [
    "/new",
    "hex:2f ff",
]
absent = [
    "/dev/x",
]

[image]
size = 300

[image.params]
22 = 1
134 = 65535

[image.bytes]
181 = """
01 01 01 01 01 01 01 01 01 01 01 01 01 01 01 01 01 01 01 01 01 01 01 01 01 01 01 01 01 01 01 01
01
"""
250 = "41 ff"

[disk]
size = 2000000
aux = "bench 2"

[disk.slots]
2 = "hex:68 65 78 3a 34"
9 = "SN004217"
10 = "hex:01"

[disk.tuning.0]

[disk.tuning.3]
raw = "e4"
qwaAECSwitch = "qwaOn"
qwaRecvAGCAmpTgts = [1, -2]
qwaSendGain = -7

[disk.bytes]
9 = "79"
1500000 = "78"

[files]
"/a" = "one line\n"
"/b" = """
two "lines"\r
	and \\ "\"\"
"""
"/c" = { hex = "ff" }
"/d" = { repeat = "x", count = 64 }
"/e" = { repeat = { hex = "00" }, count = 65 }
"/f" = ""
"/g" = """
a
b\""""

[files."/s"]
size = 4096

[files."/s".bytes]
4095 = "7a"

[files."/t"]
size = 1

[links]
"/l" = "../x"
"/m" = "hex:68 65 78 3a"
)";

kit::UnitDescription parse(const std::string& text) {
    return kit::parseDescription(text, "unit.toml");
}

TEST(DescriptionText, IsWhatAReaderWouldWrite) {
    EXPECT_EQ(kit::descriptionText(wholeUnit()), WHOLE_TEXT);
}

TEST(DescriptionText, GivesTheSameUnitWhenParsed) {
    EXPECT_TRUE(parse(WHOLE_TEXT) == wholeUnit());
}

TEST(DescriptionText, OfAnEmptyUnitIsTheTwoSizes) {
    const std::string text = kit::descriptionText({});
    EXPECT_EQ(text, "[image]\nsize = 179\n\n[disk]\nsize = 2097152\n");
    EXPECT_TRUE(parse(text) == kit::UnitDescription());
}

TEST(DescriptionText, EveryDifferenceMakesUnitsUnequal) {
    using Change = void (*)(kit::UnitDescription&);
    const Change changes[] = {
        [](kit::UnitDescription& unit) { unit.image.size = 301; },
        [](kit::UnitDescription& unit) { unit.image.params[22] = 2; },
        [](kit::UnitDescription& unit) { unit.image.bytes[250] = "A"; },
        [](kit::UnitDescription& unit) { unit.disk.size += 1; },
        [](kit::UnitDescription& unit) { unit.disk.slots.erase(9); },
        [](kit::UnitDescription& unit) { unit.disk.aux.reset(); },
        [](kit::UnitDescription& unit) { unit.disk.tuning[3].raw = "\xE5"; },
        [](kit::UnitDescription& unit) { unit.disk.tuning[3].fields["qwaSendGain"] = "x"; },
        [](kit::UnitDescription& unit) { unit.disk.bytes.clear(); },
        [](kit::UnitDescription& unit) { unit.files["/a"] = ""; },
        [](kit::UnitDescription& unit) { unit.sparseFiles["/t"].size = 2; },
        [](kit::UnitDescription& unit) { unit.sparseFiles["/s"].bytes.clear(); },
        [](kit::UnitDescription& unit) { unit.links["/l"] = "x"; },
        [](kit::UnitDescription& unit) { unit.folders.pop_back(); },
        [](kit::UnitDescription& unit) { unit.absent.pop_back(); },
    };
    for (const Change& change : changes) {
        kit::UnitDescription changed = wholeUnit();
        change(changed);
        EXPECT_FALSE(changed == wholeUnit()) << &change - changes;
        EXPECT_NE(kit::descriptionText(changed), WHOLE_TEXT) << &change - changes;
    }
}

TEST(DescriptionText, RandomUnitsSurviveTheRoundTrip) {
    for (std::uint32_t seed = 0; seed < 400; ++seed) {
        const kit::UnitDescription unit = RandomUnit(seed).unit();
        const std::string text = kit::descriptionText(unit);
        ASSERT_TRUE(parse(text) == unit) << seed << "\n" << text;
    }
}

TEST(DescriptionText, EveryCharacterSurvivesInEveryPlace) {
    std::string all;
    for (int c = 0; c < 0x80; ++c) {
        all += static_cast<char>(c);
    }
    all += "\xC2\x80\xC2\x85\xC3\xBF\xE2\x80\xA8\xEF\xBB\xBF\xEF\xBF\xBE\xEF\xBF\xBF"
           "\xF4\x8F\xBF\xBF";
    kit::UnitDescription unit;
    for (std::size_t at = 0; at < all.size(); ++at) {
        const std::string number = std::to_string(at);
        const std::string part = all.substr(at, 1);
        unit.files["/text" + number] = std::string("readable\nenough").append(all.substr(at)) + '"';
        unit.files["/one" + number] = part;
        if (part != "/" && part[0] != '\0') {
            unit.files["/name" + part] = "";
            unit.links["/link" + number] = all.substr(at).append(all.substr(128));
        }
        unit.disk.aux = all.substr(at);
        ASSERT_TRUE(parse(kit::descriptionText(unit)) == unit) << at;
    }
}

TEST(DescriptionText, QuotesSurviveInEveryPlace) {
    for (int bits = 0; bits < 256; ++bits) {
        std::string text = "\n";
        for (int bit = 0; bit < 8; ++bit) {
            text += (bits >> bit & 1) != 0 ? '"' : "\n\\a"[bit % 3];
        }
        kit::UnitDescription unit;
        unit.files["/x"] = text;
        ASSERT_TRUE(parse(kit::descriptionText(unit)) == unit) << text;
    }
}

TEST(TomlText, ReadableIsUtf8WithFewControlCharacters) {
    EXPECT_TRUE(kit::isReadable(""));
    EXPECT_TRUE(kit::isReadable("\n\r\t"));
    EXPECT_TRUE(kit::isReadable("caf\xC3\xA9"));
    EXPECT_TRUE(kit::isReadable(std::string("1234567\0", 8)));
    EXPECT_FALSE(kit::isReadable(std::string("123456\0", 7)));
    EXPECT_FALSE(kit::isReadable("\x7F"));
    for (const char* text : {"\x80", "\xC3", "\xC0\x80", "\xC1\xBF", "\xE0\x9F\xBF", "\xED\xA0\x80",
                             "\xF0\x8F\xBF\xBF", "\xF4\x90\x80\x80", "\xF5\x80\x80\x80",
                             "long enough \xE2\x82", "\xFF"}) {
        EXPECT_FALSE(kit::isReadable(text)) << kit::tomlHex(text);
    }
}

TEST(DescriptionText, ContainsNothingThatATerminalObeys) {
    const std::string obeyed =
        "\x1b[2J\x7f\u009b\u00ad\u061c\u200b\u200f\u2028\u202e\u202c\u2066\u2069\ufeff"
        "\U000e0001";
    const std::string readable = std::string(80, 'x') + obeyed;
    kit::UnitDescription unit;
    unit.files = {{"/" + obeyed, readable}, {"/lines", readable + "\n\tand\n" + readable}};
    unit.links = {{"/link", obeyed}};
    unit.folders = {"/folder" + obeyed};
    unit.disk.aux = "some text\u202etext\u202c";
    const std::string text = kit::descriptionText(unit);
    kit::forEachCharacter(text, [](char32_t character, std::string_view bytes) {
        EXPECT_TRUE(!isControlOrFormat(character) || character == U'\n' || character == U'\t')
            << kit::hexText(bytes);
    });
    EXPECT_NE(text.find(R"("some text\u202etext\u202c")"), std::string::npos);
    EXPECT_NE(text.find(R"(\U000e0001)"), std::string::npos);
    EXPECT_TRUE(parse(text) == unit);
}

} // namespace

} // namespace orvane::test
