// SPDX-License-Identifier: Apache-2.0
//
// The forms in which a description gives paths, contents and links.
#include "kit/description/parse_description.h"
#include "kit/description/unit_description.h"
#include "kit/host/kit_error.h"
#include "tests/kit/description/description_equality.h"
#include "tests/support/temporary_folder.h"
#include "tests/support/unit_test.h"

#include <gtest/gtest.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <filesystem>
#include <string>
#include <thread>
#include <vector>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;

kit::UnitDescription parse(const std::string& text) {
    return kit::parseDescription(text, "unit.toml");
}

/// The content of the file /x that `toml` gives.
std::string contentOf(const std::string& toml) {
    return parse("[files]\n\"/x\" = " + toml + "\n").files.at("/x");
}

TEST(DescriptionContent, FileIsATextHexOrARepeatedPart) {
    EXPECT_EQ(contentOf("\"\"\"a\\\n  \xC3\xA9\"\"\""), "a\xC3\xA9"); // a continued line
    EXPECT_EQ(contentOf("\"a\\u0000\\n\""), std::string("a\0\n", 3));
    EXPECT_EQ(contentOf("\"hex:41\""), "hex:41"); // the content of a file has no prefix
    EXPECT_EQ(contentOf("{ hex = \"00 fF\\n0A\" }"), std::string("\0\xFF\n", 3));
    EXPECT_EQ(contentOf("{ hex = \"\"\"\n00\n01\n\"\"\" }"), std::string("\0\x01", 2));
    EXPECT_EQ(contentOf("{ hex = \"\" }"), "");
    EXPECT_EQ(contentOf("{ repeat = \"ab\", count = 3 }"), "ababab");
    EXPECT_EQ(contentOf("{ repeat = \"hex:\", count = 2 }"), "hex:hex:");
    EXPECT_EQ(contentOf("{ repeat = { hex = \"ff 00\" }, count = 2 }"),
              std::string("\xFF\0\xFF\0", 4));
    EXPECT_EQ(contentOf("{ repeat = \"ab\", count = 0 }"), "");
    EXPECT_EQ(contentOf("{ repeat = \"\", count = 1073741824 }"), "");
}

TEST(DescriptionContent, PartsFollowOneAnother) {
    EXPECT_EQ(contentOf("[\"a\", { repeat = \"bc\", count = 2 }, { hex = \"00\" }, \"d\\n\"]"),
              std::string("abcbc\0d\n", 8));
    EXPECT_EQ(contentOf("[]"), "");
}

TEST(DescriptionContent, MostlyZeroFileIsASizeAndBytes) {
    const kit::UnitDescription unit = parse("[files]\n"
                                            "\"/a\" = { size = 10, bytes = { 0x2 = \"41\", \"8\" = "
                                            "\"42 43\" } }\n"
                                            "\"/b\" = { size = 9223372036854775807 }\n"
                                            "[files.\"/c\"]\nsize = 1\n[files.\"/c\".bytes]\n"
                                            "0 = \"ff\"\n");
    EXPECT_TRUE(unit.files.empty());
    ASSERT_EQ(unit.sparseFiles.size(), 3U);
    EXPECT_EQ(unit.sparseFiles.at("/a"), (kit::SparseFile{10, {{2, "A"}, {8, "BC"}}}));
    EXPECT_EQ(unit.sparseFiles.at("/b"), (kit::SparseFile{9223372036854775807U, {}}));
    EXPECT_EQ(unit.sparseFiles.at("/c"), (kit::SparseFile{1, {{0, "\xFF"}}}));
}

TEST(DescriptionContent, LinkHasATarget) {
    const kit::UnitDescription unit = parse("[links]\n\"/a\" = \"b/../c\"\n\"/d\" = \"hex:ff 2f\"\n"
                                            "\"hex:2fff\" = \"/e\"\n");
    EXPECT_EQ(unit.links, (std::map<std::string, std::string>{
                              {"/a", "b/../c"}, {"/d", "\xFF/"}, {"/\xFF", "/e"}}));
}

TEST(DescriptionContent, EveryPathMayBeInHex) {
    const kit::UnitDescription unit =
        parse("folders = [\"hex:2f61\", \"/hex:62\"]\nabsent = [\"hex:2fFE\"]\n"
              "[files]\n\"hex:2ffd\" = \"x\"\n\"hex:2f6a\" = { size = 1 }\n");
    EXPECT_EQ(unit.folders, (std::vector<std::string>{"/a", "/hex:62"}));
    EXPECT_EQ(unit.absent, (std::vector<std::string>{"/\xFE"}));
    EXPECT_EQ(unit.files, (std::map<std::string, std::string>{{"/\xFD", "x"}}));
    EXPECT_EQ(unit.sparseFiles.count("/j"), 1U);
}

std::string refusalOfText(const std::string& text) {
    try {
        parse(text);
    } catch (const kit::KitError& error) {
        return error.text();
    }
    return "accepted";
}

TEST(DescriptionContent, ErrorHasThePathWhole) {
    EXPECT_EQ(refusalOfText("[files]\n\"/a\\nb\" = 1\n")
                  .rfind("unit.toml:2:11: the content of /a\nb must", 0),
              0U);
    const std::string zero("unlike \"/a\0b\"", 13);
    EXPECT_NE(refusalOfText("[files]\n\"/a\\u0000b\" = 1\n").find(zero), std::string::npos);
}

class HostContentTest : public ::testing::Test {
protected:
    HostContentTest() : hostCwd_(fs::current_path()) {
        writeFile(folder() / "content", CONTENT);
        fs::create_directory(folder() / "below");
    }
    ~HostContentTest() override { fs::current_path(hostCwd_); }

    const fs::path& folder() const { return folder_.path(); }

    /// Reads a description at `file` that takes the content of /x from `path`.
    static kit::UnitDescription read(const fs::path& file, const std::string& path) {
        writeFile(file, "[files]\n\"/x\" = { path = \"" + path + "\" }\n");
        return kit::readDescription(file);
    }

    static std::string refusalOf(const fs::path& file, const std::string& path) {
        try {
            read(file, path);
        } catch (const kit::KitError& error) {
            return error.what();
        }
        return "";
    }

    const std::string CONTENT = std::string("any\0\xFF\r\n", 7);

private:
    TemporaryFolder folder_;
    fs::path hostCwd_;
};

TEST_F(HostContentTest, PathIsRelativeToTheFolderOfTheDescription) {
    EXPECT_EQ(read(folder() / "unit.toml", "content").files.at("/x"), CONTENT);
    EXPECT_EQ(read(folder() / "below/unit.toml", "../content").files.at("/x"), CONTENT);
    EXPECT_EQ(read(folder() / "below/unit.toml", (folder() / "content").string()).files.at("/x"),
              CONTENT);
    fs::current_path(folder());
    EXPECT_EQ(read("unit.toml", "content").files.at("/x"), CONTENT);
    EXPECT_EQ(read("below/unit.toml", "../content").files.at("/x"), CONTENT);
}

TEST_F(HostContentTest, PathInAParsedTextIsRelativeToTheFolderOfItsName) {
    const std::string text = "[files]\n\"/x\" = { path = \"content\" }\n";
    EXPECT_EQ(kit::parseDescription(text, folder() / "any").files.at("/x"), CONTENT);
    fs::current_path(folder());
    EXPECT_EQ(kit::parseDescription(text, "any").files.at("/x"), CONTENT);
}

TEST_F(HostContentTest, EmptyFileAndLinkAreAccepted) {
    writeFile(folder() / "empty", "");
    fs::create_symlink("content", folder() / "link");
    EXPECT_EQ(read(folder() / "unit.toml", "empty").files.at("/x"), "");
    EXPECT_EQ(read(folder() / "unit.toml", "link").files.at("/x"), CONTENT);
}

TEST_F(HostContentTest, AnythingButAFileIsRefusedWithItsPlace) {
    const fs::path file = folder() / "unit.toml";
    const std::string place = file.string() + ":2:17: the content of /x: ";
    EXPECT_EQ(refusalOf(file, "missing"), place + "cannot read " + (folder() / "missing").string() +
                                              ": No such file or directory");
    EXPECT_EQ(refusalOf(file, "below"),
              place + (folder() / "below").string() + " is not a regular file");
    ASSERT_EQ(::mkfifo((folder() / "pipe").c_str(), 0600), 0);
    EXPECT_EQ(refusalOf(file, "pipe"),
              place + (folder() / "pipe").string() + " is not a regular file");
    writeFile(folder() / "long", "");
    fs::resize_file(folder() / "long", (std::uint64_t{1} << 30U) + 1);
    EXPECT_EQ(refusalOf(file, "long"), place + (folder() / "long").string() +
                                           " has more than 1073741824 bytes, the most allowed");
}

TEST_F(HostContentTest, DescriptionMayComeLateThroughAPipe) {
    const std::string text = "[files]\n\"/x\" = \"through\"\n";
    int ends[2];
    ASSERT_EQ(::pipe(ends), 0);
    const pid_t writer = ::fork();
    if (writer == 0) {
        std::this_thread::sleep_for(std::chrono::milliseconds(50));
        ::_exit(::write(ends[1], text.data(), text.size()) == -1 ? 1 : 0);
    }
    ::close(ends[1]);
    EXPECT_EQ(kit::readDescription("/dev/fd/" + std::to_string(ends[0])).files.at("/x"), "through");
    ::close(ends[0]);
    int status = -1;
    EXPECT_EQ(::waitpid(writer, &status, 0), writer);
    EXPECT_EQ(status, 0);
}

} // namespace

} // namespace orvane::test
