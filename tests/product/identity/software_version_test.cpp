// SPDX-License-Identifier: Apache-2.0
#include "identity/software_version.h"
#include "tests/product/identity/version_folder_test.h"
#include "tests/support/resource_limit.h"

namespace orvane::test {

class SoftwareVersionTest : public VersionFolderTest {};

// Rules: VER-01
TEST_F(SoftwareVersionTest, FolderIsTheVersionFolderWithItsSlash) {
    EXPECT_STREQ(VERSION_DIR, "/fs/rwdata/.Version/");
}

TEST_F(SoftwareVersionTest, VersionOfTheApplicationIsFound) {
    put("app.inf", description("Application", "3.10.2"));
    EXPECT_EQ(findApplicationVersion(), "3.10.2");
    EXPECT_EQ(softwareVersion(), "030a02");
}

// Rules: VER-21
TEST_F(SoftwareVersionTest, MissingFolderGivesNoVersion) {
    remove(VERSION_FOLDER);
    EXPECT_EQ(findApplicationVersion(), "");
    EXPECT_EQ(softwareVersion(), "000000");
}

TEST_F(SoftwareVersionTest, FileInPlaceOfTheFolderGivesNoVersion) {
    remove(VERSION_FOLDER);
    writeFile(VERSION_FOLDER, description("Application", "1.2.3"));
    EXPECT_EQ(findApplicationVersion(), "");
    EXPECT_EQ(softwareVersion(), "000000");
}

TEST_F(SoftwareVersionTest, EmptyFolderGivesNoVersion) {
    EXPECT_EQ(findApplicationVersion(), "");
    EXPECT_EQ(softwareVersion(), "000000");
}

// Rules: VER-21
TEST_F(SoftwareVersionTest, NoFileOfTheTypeGivesNoVersion) {
    put("a.inf", description("Bootloader", "1.2.3"));
    put("b.inf", "Version Number=4.5.6\n");
    put("c.inf", "");
    EXPECT_EQ(findApplicationVersion(), "");
    EXPECT_EQ(softwareVersion(), "000000");
}

// Rules: VER-19, VER-20
TEST_F(SoftwareVersionTest, PrefixBeforeTheFirstUnderscoreIsDropped) {
    constexpr const char* TABLE[][2] = {
        {"ABC_3.10.2_rc", "3.10.2_rc"},
        {"V_2.0.1", "2.0.1"},
        {"ABC_1.2.3_45", "1.2.3_45"},
        {"_1.2.3", "1.2.3"},
        {"A__1", "_1"},
        {"1.2.3_", ""},
        {"_", ""},
        {"A_ 1.2", " 1.2"},
        {"1.2.3_4", "4"},
        {"1.2.3", "1.2.3"},
        {"N/A", "N/A"},
        {"ABC-1.2", "ABC-1.2"},
    };
    for (const auto& row : TABLE) {
        EXPECT_EQ(versionOf(description("Application", row[0])), row[1]) << row[0];
    }
}

TEST_F(SoftwareVersionTest, VersionInTheFileBecomesDigits) {
    constexpr const char* TABLE[][2] = {
        {"3.10.2", "030a02"},  {"ABC_1.2.3_45", "010203"}, {"V_2.0.1", "020001"},
        {"N/A", "000000"},     {"1.2", "010202"},          {"7", "070707"},
        {"", "000000"},        {"256.15.x", "000f00"},     {"X_N/A", "000000"},
        {"1.2.3_4", "040404"}, {"-1.0.0", "ffffffff0000"}, {"1.2.3\r", "010203"},
    };
    for (const auto& row : TABLE) {
        put("app.inf", description("Application", row[0]));
        EXPECT_EQ(softwareVersion(), row[1]) << row[0];
    }
}

// Rules: VER-09
TEST_F(SoftwareVersionTest, CarriageReturnsAndTabsAreKept) {
    EXPECT_EQ(versionOf("Type=Application\r\nVersion Number=\t1.2.3\r\n"), "\t1.2.3\r");
}

TEST_F(SoftwareVersionTest, ZeroBytesAreKept) {
    EXPECT_EQ(versionOf(description("Application", std::string("1.2\0.3", 6))),
              std::string("1.2\0.3", 6));
}

TEST_F(SoftwareVersionTest, LongLinesDoNotHideTheOthers) {
    const std::string tail(200000, '9');
    EXPECT_EQ(versionOf("Type=Application\nNote=" + tail + "\nVersion Number=1.2." + tail + "\n"),
              "1.2." + tail);
}

// Rules: RUN-14
TEST_F(SoftwareVersionTest, EachCallScansAgain) {
    put("app.inf", description("Application", "1.2.3"));
    EXPECT_EQ(findApplicationVersion(), "1.2.3");
    EXPECT_EQ(findApplicationVersion(), "1.2.3");
    put("app.inf", description("Application", "4.5.6"));
    EXPECT_EQ(findApplicationVersion(), "4.5.6");
    EXPECT_EQ(softwareVersion(), "040506");
    remove(pathOf("app.inf"));
    EXPECT_EQ(findApplicationVersion(), "");
    put("app.inf", description("Application", "7.8.9"));
    EXPECT_EQ(findApplicationVersion(), "7.8.9");
    remove(VERSION_FOLDER);
    EXPECT_EQ(findApplicationVersion(), "");
}

// Rules: RUN-05
TEST_F(SoftwareVersionTest, FolderIsOnlyRead) {
    put("app.inf", description("Application", "1.2.3"));
    EXPECT_EQ(softwareVersion(), "010203");
    EXPECT_EQ(listing(), std::vector<std::string>{"app.inf"});
    EXPECT_EQ(readFile(pathOf("app.inf")), description("Application", "1.2.3"));
    remove(VERSION_FOLDER);
    EXPECT_EQ(softwareVersion(), "000000");
    EXPECT_FALSE(exists(VERSION_FOLDER));
}

TEST_F(SoftwareVersionTest, OnlyTheListingAndOneFileAreOpenAtATime) {
    std::vector<std::string> names;
    names.reserve(40);
    for (int i = 0; i < 40; ++i) {
        names.push_back(std::to_string(i) + ".inf");
    }
    const std::vector<std::string> listed = makeFiles(names);
    put(listed.back(), description("Application", "1.2.3"));
    const ResourceLimit limit(RLIMIT_NOFILE, roomForDescriptors(2));
    EXPECT_EQ(findApplicationVersion(), "1.2.3");
}

TEST_F(SoftwareVersionTest, LeavesNoDescriptorOpen) {
    put("app.inf", description("Application", "1.2.3"));
    std::filesystem::create_directory(pathOf("x.inf"));
    const int before = openDescriptors();
    EXPECT_EQ(softwareVersion(), "010203");
    EXPECT_EQ(openDescriptors(), before);
    remove(VERSION_FOLDER);
    EXPECT_EQ(softwareVersion(), "000000");
    EXPECT_EQ(openDescriptors(), before);
}

} // namespace orvane::test
