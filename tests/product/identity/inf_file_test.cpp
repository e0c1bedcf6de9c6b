// SPDX-License-Identifier: Apache-2.0
#include "identity/inf_file.h"
#include "tests/support/input_lengths.h"
#include "tests/support/permissions.h"
#include "tests/support/unit_test.h"

namespace orvane::test {

constexpr char INF_FILE[] = "/tmp/package.inf";

class InfFileTest : public UnitTest {
protected:
    static Inf_Data parse(const std::string& content) {
        writeFile(INF_FILE, content);
        Inf_Data record;
        readInfFile(INF_FILE, record);
        return record;
    }
};

// Rules: VER-08
TEST(TrimSpacesTest, OnlySpacesAtTheEndsAreRemoved) {
    constexpr const char* TABLE[][2] = {
        {"", ""},    {" ", ""},        {"     ", ""},  {"a", "a"},           {" a", "a"},
        {"a ", "a"}, {"   a   ", "a"}, {"a b", "a b"}, {"  a  b  ", "a  b"}, {" = ", "="},
    };
    for (const auto& row : TABLE) {
        EXPECT_EQ(trimSpaces(row[0]), row[1]) << '"' << row[0] << '"';
    }
}

// Rules: VER-09
TEST(TrimSpacesTest, OtherWhiteSpaceIsKept) {
    for (const char c : {'\t', '\r', '\n', '\v', '\f', '\0', '\xA0'}) {
        SCOPED_TRACE(static_cast<int>(c));
        EXPECT_EQ(trimSpaces(std::string{c}), std::string({c}));
        EXPECT_EQ(trimSpaces(std::string{' ', ' ', c, ' '}), std::string({c}));
        EXPECT_EQ(trimSpaces(std::string{c, ' ', 'a', ' ', c}), std::string({c, ' ', 'a', ' ', c}));
    }
}

TEST(InfValueTest, GivesTheValueOrTheEmptyText) {
    const Inf_Data record = {{"Type", "Application"}, {"Empty", ""}};
    EXPECT_EQ(infValue(record, "Type"), "Application");
    EXPECT_EQ(infValue(record, "Empty"), "");
    EXPECT_EQ(infValue(record, "type"), "");
    EXPECT_EQ(infValue(record, "Typ"), "");
    EXPECT_EQ(infValue(record, "Types"), "");
    EXPECT_EQ(infValue(record, ""), "");
    EXPECT_EQ(infValue({}, "Type"), "");
}

TEST(InfValueTest, EmptyKeyIsAKeyLikeAnyOther) {
    EXPECT_EQ(infValue({{"", "nameless"}}, ""), "nameless");
}

TEST(InfDataTest, KeysAreInByteOrder) {
    const Inf_Data record = {{"\x80", "4"}, {"b", "3"}, {"B", "1"}, {"a", "2"}, {"", "0"}};
    std::string values;
    for (const auto& entry : record) {
        values += entry.second;
    }
    EXPECT_EQ(values, "01234");
}

// Rules: VER-05
TEST_F(InfFileTest, LinesBecomeEntries) {
    EXPECT_EQ(parse("Type=Application\nVersion Number=3.10.2\n"),
              (Inf_Data{{"Type", "Application"}, {"Version Number", "3.10.2"}}));
}

TEST_F(InfFileTest, AllKeysAreKept) {
    EXPECT_EQ(parse("Size=12\nVendor=none\nX=y\n"),
              (Inf_Data{{"Size", "12"}, {"Vendor", "none"}, {"X", "y"}}));
}

// Rules: VER-04
TEST_F(InfFileTest, LastLineNeedsNoLineEnd) {
    EXPECT_EQ(parse("A=1\nB=2"), (Inf_Data{{"A", "1"}, {"B", "2"}}));
}

// Rules: VER-08
TEST_F(InfFileTest, SpacesAroundKeyAndValueAreRemoved) {
    EXPECT_EQ(parse("   Type   =   Main Application   \n"),
              (Inf_Data{{"Type", "Main Application"}}));
}

// Rules: VER-05
TEST_F(InfFileTest, OnlyTheFirstEqualsSignSplits) {
    EXPECT_EQ(parse("A=1=2=3\nB==\nC= =4\n"), (Inf_Data{{"A", "1=2=3"}, {"B", "="}, {"C", "=4"}}));
}

// Rules: VER-11
TEST_F(InfFileTest, LaterLineReplacesAnEarlierOneOfTheSameKey) {
    EXPECT_EQ(parse("A=1\nB=2\n A =3\n"), (Inf_Data{{"A", "3"}, {"B", "2"}}));
}

// Rules: VER-12
TEST_F(InfFileTest, KeysAreCaseSensitive) {
    EXPECT_EQ(parse("Type=1\ntype=2\n"), (Inf_Data{{"Type", "1"}, {"type", "2"}}));
}

// Rules: VER-06
TEST_F(InfFileTest, LineWithoutEqualsSignIsSkipped) {
    EXPECT_EQ(parse("Type\n\n   \n[section]\nA=1\n; comment\n"), (Inf_Data{{"A", "1"}}));
}

// Rules: VER-07
TEST_F(InfFileTest, LineWithNothingAfterTheEqualsSignIsSkipped) {
    EXPECT_EQ(parse("A=\nB=2\n=\n  =\nC="), (Inf_Data{{"B", "2"}}));
}

// Rules: VER-07
TEST_F(InfFileTest, SkippedEmptyValueKeepsTheEarlierOne) {
    EXPECT_EQ(parse("A=1\nA=\n"), (Inf_Data{{"A", "1"}}));
}

// Rules: VER-10
TEST_F(InfFileTest, ValueOfSpacesIsAnEmptyEntry) {
    EXPECT_EQ(parse("A= \n"), (Inf_Data{{"A", ""}}));
    EXPECT_EQ(parse("A=1\nA=   \n"), (Inf_Data{{"A", ""}}));
}

TEST_F(InfFileTest, LineStartingWithTheEqualsSignHasTheEmptyKey) {
    EXPECT_EQ(parse("=1\n"), (Inf_Data{{"", "1"}}));
    EXPECT_EQ(parse("   =2\n"), (Inf_Data{{"", "2"}}));
}

// Rules: VER-09
TEST_F(InfFileTest, CarriageReturnBelongsToTheValue) {
    EXPECT_EQ(parse("A=1\r\nB=\r\nC=2 \r\n\r\n"),
              (Inf_Data{{"A", "1\r"}, {"B", "\r"}, {"C", "2 \r"}}));
}

TEST_F(InfFileTest, CarriageReturnAloneDoesNotEndALine) {
    EXPECT_EQ(parse("A=1\rB=2\n"), (Inf_Data{{"A", "1\rB=2"}}));
}

// Rules: VER-09
TEST_F(InfFileTest, TabsAreKept) {
    EXPECT_EQ(parse("\tA\t=\t1\t\n \tB = 2\n"), (Inf_Data{{"\tA\t", "\t1\t"}, {"\tB", "2"}}));
}

// Rules: VER-13
TEST_F(InfFileTest, ZeroBytesAreTextLikeAnyOther) {
    const std::string content("K\0y=v\0l\nB=\0\n", 12);
    EXPECT_EQ(parse(content), (Inf_Data{{std::string("K\0y", 3), std::string("v\0l", 3)},
                                        {"B", std::string(1, '\0')}}));
}

// Rules: VER-13
TEST_F(InfFileTest, BytesAbove127AreTextLikeAnyOther) {
    EXPECT_EQ(parse("\xFF\xFE=\x80\n"), (Inf_Data{{"\xFF\xFE", "\x80"}}));
}

// Rules: VER-13
TEST_F(InfFileTest, LongLinesAreReadWhole) {
    for (const std::size_t length : INPUT_LENGTHS) {
        SCOPED_TRACE(length);
        const std::string longKey(length, 'k');
        const std::string longValue(length - 1, 'v');
        std::string content = longKey;
        content.append("=").append(longValue).append("\nA=1\n");
        content.append(length, 'x').append("\nB=2\n");
        EXPECT_TRUE(parse(content) == (Inf_Data{{longKey, longValue}, {"A", "1"}, {"B", "2"}}));
    }
}

TEST_F(InfFileTest, LinesOfLongFilesAreReadToTheLast) {
    for (const std::size_t length : {INPUT_LENGTHS[0], INPUT_LENGTHS[7], LONGER_THAN_ANY_BUFFER}) {
        SCOPED_TRACE(length);
        EXPECT_TRUE(parse(markedText(length) + "\nA=1\n") == (Inf_Data{{"A", "1"}}));
    }
}

TEST_F(InfFileTest, EmptyFileGivesNothing) {
    EXPECT_EQ(parse(""), Inf_Data{});
    EXPECT_EQ(parse("\n\n\n"), Inf_Data{});
}

TEST_F(InfFileTest, FileIsAddedToTheRecord) {
    writeFile(INF_FILE, "B=20\nC=30\n");
    Inf_Data record = {{"A", "1"}, {"B", "2"}};
    readInfFile(INF_FILE, record);
    EXPECT_EQ(record, (Inf_Data{{"A", "1"}, {"B", "20"}, {"C", "30"}}));
}

// Rules: VER-22
TEST_F(InfFileTest, FileThatCannotBeOpenedOrReadAddsNothing) {
    std::filesystem::create_directory("/tmp/folder.inf");
    std::filesystem::create_symlink("/tmp/nowhere", "/tmp/dangling.inf");
    std::filesystem::create_symlink("/tmp/loop.inf", "/tmp/loop.inf");
    for (const char* path : {"/tmp/missing.inf", "/tmp/folder.inf", "/tmp/dangling.inf",
                             "/tmp/loop.inf", "/nowhere/x.inf", ""}) {
        SCOPED_TRACE(path);
        Inf_Data record;
        readInfFile(path, record);
        EXPECT_TRUE(record.empty());
        record = {{"A", "1"}};
        readInfFile(path, record);
        EXPECT_EQ(record, (Inf_Data{{"A", "1"}}));
    }
}

// Rules: VER-22
TEST_F(InfFileTest, FileWithoutReadPermissionAddsNothing) {
    writeFile(INF_FILE, "A=1\n");
    std::filesystem::permissions(INF_FILE, std::filesystem::perms::none);
    const EnforcedPermissions permissionsHold;
    Inf_Data record;
    readInfFile(INF_FILE, record);
    EXPECT_TRUE(record.empty());
}

// Rules: RUN-05
TEST_F(InfFileTest, FileIsOnlyRead) {
    parse("A=1\n");
    EXPECT_EQ(readFile(INF_FILE), "A=1\n");
    Inf_Data record;
    readInfFile("/tmp/missing.inf", record);
    EXPECT_FALSE(exists("/tmp/missing.inf"));
}

TEST_F(InfFileTest, LeavesNoDescriptorOpen) {
    const int before = openDescriptors();
    parse("A=1\n");
    EXPECT_EQ(openDescriptors(), before);
    Inf_Data record;
    readInfFile("/tmp", record);
    EXPECT_EQ(openDescriptors(), before);
    readInfFile("/tmp/missing.inf", record);
    EXPECT_EQ(openDescriptors(), before);
}

} // namespace orvane::test
