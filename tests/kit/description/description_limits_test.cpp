// SPDX-License-Identifier: Apache-2.0
//
// What keeps a description from taking all stack, memory or disk.
#include "kit/description/description_text.h"
#include "kit/description/parse_description.h"
#include "kit/description/unit_description.h"
#include "kit/host/kit_error.h"
#include "tests/support/temporary_folder.h"
#include "tests/support/unit_test.h"

#include <gtest/gtest.h>

#include <cstddef>
#include <filesystem>
#include <string>

namespace orvane::test {

namespace {

std::string repeated(const std::string& part, std::size_t count) {
    std::string text;
    for (std::size_t i = 0; i < count; ++i) {
        text += part;
    }
    return text;
}

/// "a.a.a", with so many parts.
std::string dottedKey(std::size_t parts, const std::string& part = "a") {
    return repeated(part + ".", parts - 1) + part;
}

/// The complaint about a text; empty when it is a description.
std::string complaint(const std::string& text) {
    try {
        kit::parseDescription(text, "unit.toml");
        return "";
    } catch (const kit::KitError& error) {
        return error.what();
    }
}

void expectComplaint(const std::string& text, const std::string& beginning) {
    const std::string found = complaint(text);
    EXPECT_EQ(found.substr(0, beginning.size()), beginning) << found;
}

TEST(DescriptionLimitsTest, KeyOfManyPartsIsRefusedAtItsPlace) {
    constexpr std::size_t MANY = 200000;
    const std::string key = dottedKey(MANY);
    const std::string message = ": a key has more than 16 parts";
    EXPECT_EQ(complaint(key + " = 1\n"), "unit.toml:1:32" + message);
    EXPECT_EQ(complaint(dottedKey(17) + " = 1\n"), "unit.toml:1:32" + message);
    EXPECT_EQ(complaint("# a\n[" + key + "]\n"), "unit.toml:2:33" + message);
    EXPECT_EQ(complaint("[[" + key + "]]\n"), "unit.toml:1:34" + message);
    EXPECT_EQ(complaint("disk = { " + dottedKey(MANY, "\"\xC3\xA9\"") + " = 1 }\n"),
              "unit.toml:1:73" + message);
    EXPECT_EQ(complaint("aux = [{ " + dottedKey(MANY, "'.'") + " = 1 }]\n"),
              "unit.toml:1:73" + message);
}

TEST(DescriptionLimitsTest, KeyOfTheMostPartsReachesItsReader) {
    expectComplaint(dottedKey(16) + " = 1\n", "unit.toml:1:1: unknown key \"a\" ");
}

TEST(DescriptionLimitsTest, DeepestTreeIsTakenApart) {
    const std::string key = dottedKey(16);
    expectComplaint("[" + key + "]\n" + key + " = " + repeated("{ " + key + " = ", 15) + "1" +
                        repeated(" }", 15) + "\n",
                    "unit.toml:1:2: unknown key \"a\" ");
}

TEST(DescriptionLimitsTest, NestedValuesAreRefusedAtTheirPlace) {
    for (const char* const open : {"[", "{a="}) {
        const std::string text = "aux = " + repeated(open, 200000) + "\n";
        EXPECT_NE(complaint(text).find("exceeded maximum nested value depth of 16"),
                  std::string::npos)
            << complaint(text);
        expectComplaint(text, "unit.toml:1:");
    }
}

/// `text` with more dots for each of its dots than a key may have.
std::string withManyDots(const std::string& text) {
    std::string result;
    for (const char character : text) {
        result.append(character == '.' ? 40 : 1, character);
    }
    return result;
}

TEST(DescriptionLimitsTest, DotsThatDivideNoKeyDoNotCount) {
    for (const char* const text : {
             "[files]\n\"/.x\" = '.' # .\n",
             "[files]\n\"/a\" = '''.'.'''''\n",
             "[files]\n\"/a\" = \"\"\"\n.\".\\\".\"\"\"\"\"\n",
             "[files]\n\"/a\" = \"\\\\\"\n\"/b\" = \"\\\".\" # \"\n",
             "[files]\n\"/a\" = \"\" # ''' \"\"\"\n\"/b\" = \".\"\n",
         }) {
        EXPECT_EQ(complaint(withManyDots(text)), "") << text;
    }
}

TEST(DescriptionLimitsTest, AllContentTogetherIsLimited) {
    const std::string part(1U << 16U, 'x');
    const std::string more = " = { repeat = \"" + part + "\", count = 8193 }\n";
    expectComplaint("[files]\n\"/a\"" + more + "\"/b\"" + more,
                    "unit.toml:3:65567: count in the content of /b must be from 0 to 8191: 8193 ");
}

/// The complaint about a file; empty when it is a description.
std::string complaintAboutFile(const std::filesystem::path& file) {
    try {
        kit::readDescription(file);
        return "";
    } catch (const kit::KitError& error) {
        return error.what();
    }
}

TEST(DescriptionLimitsTest, LongFileIsRefused) {
    const std::string message = " has more than 16777216 bytes, the most allowed";
    const TemporaryFolder folder;
    const std::filesystem::path file = folder.path() / "unit.toml";
    writeFile(file, "=");
    std::filesystem::resize_file(file, kit::LONGEST_DESCRIPTION);
    EXPECT_EQ(complaintAboutFile(file).find(message), std::string::npos);
    std::filesystem::resize_file(file, kit::LONGEST_DESCRIPTION + 1);
    EXPECT_EQ(complaintAboutFile(file), file.string() + message);
    EXPECT_EQ(complaintAboutFile("/dev/zero"), "/dev/zero" + message);
}

TEST(DescriptionLimitsTest, UnitThatCanNotBeReadAgainIsNotDescribed) {
    kit::UnitDescription unit;
    unit.files["/x"] =
        repeated("\x01\x02", kit::LONGEST_DESCRIPTION / 6); // in hex, three times as long
    EXPECT_THROW(kit::descriptionText(unit), kit::KitError);
}

} // namespace

} // namespace orvane::test
