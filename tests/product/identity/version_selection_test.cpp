// SPDX-License-Identifier: Apache-2.0
//
// Which of the version description files is the application's.
#include "tests/product/identity/version_folder_test.h"

namespace orvane::test {

class VersionSelectionTest : public VersionFolderTest {};

// Rules: VER-02
TEST_F(VersionSelectionTest, MarkerMayStandAnywhereInTheName) {
    for (const char* name : {"a.inf", "a.info", "b.inf.old", ".inf", ".infinite", "a.b.inf~",
                             "x.inf.inf", "a inf.inf "}) {
        SCOPED_TRACE(name);
        put(name, description("Application", "1.2.3"));
        EXPECT_EQ(findApplicationVersion(), "1.2.3");
        remove(pathOf(name));
    }
}

// Rules: VER-03
TEST_F(VersionSelectionTest, NamesWithoutTheMarkerAreIgnored) {
    for (const char* name :
         {"a.INF", "a.Inf", "ainf", "inf", "a.in", "a.i.nf", "a.txt", "a_inf", "i.nf"}) {
        put(name, description("Application", "1.2.3"));
    }
    EXPECT_EQ(findApplicationVersion(), "");
}

// Rules: VER-01
TEST_F(VersionSelectionTest, FilesInSubfoldersAreIgnored) {
    std::filesystem::create_directories(pathOf("sub"));
    put("sub/app.inf", description("Application", "1.2.3"));
    EXPECT_EQ(findApplicationVersion(), "");
}

// Rules: VER-14
TEST_F(VersionSelectionTest, TypeNeedsOnlyContainTheWord) {
    for (const char* type : {"Application", "MainApplication", "Applications", "My Application 2",
                             "Boot,Application", "\tApplication\r", "=Application"}) {
        SCOPED_TRACE(type);
        EXPECT_EQ(versionOf(description(type, "1.2.3")), "1.2.3");
    }
}

// Rules: VER-15
TEST_F(VersionSelectionTest, TypeIsCaseSensitiveAndTakenWhole) {
    for (const char* type :
         {"application", "APPLICATION", "Applicatio", "pplication", "Appl ication", "App", "N/A"}) {
        SCOPED_TRACE(type);
        EXPECT_EQ(versionOf(description(type, "1.2.3")), "");
    }
}

// Rules: VER-12
TEST_F(VersionSelectionTest, KeysMustMatchExactly) {
    EXPECT_EQ(versionOf("type=Application\nVersion Number=1\n"), "");
    EXPECT_EQ(versionOf("\tType=Application\nVersion Number=1\n"), "");
    EXPECT_EQ(versionOf("Types=Application\nVersion Number=1\n"), "");
    EXPECT_EQ(versionOf("Type=Application\nVersion number=1\n"), "");
    EXPECT_EQ(versionOf("Type=Application\nVersionNumber=1\n"), "");
    EXPECT_EQ(versionOf("Type=Application\nVersion  Number=1\n"), "");
    EXPECT_EQ(versionOf("Type=Application\nVersion=1\nNumber=2\n"), "");
    EXPECT_EQ(versionOf("Other=Application\nVersion Number=1\n"), "");
}

// Rules: VER-08
TEST_F(VersionSelectionTest, SpacesAroundKeyEqualsSignAndValueDoNotMatter) {
    EXPECT_EQ(versionOf("  Type  =  Application  \n  Version Number  =  1.2.3  \n"), "1.2.3");
}

// Rules: VER-11
TEST_F(VersionSelectionTest, LastLineOfAKeyCounts) {
    EXPECT_EQ(versionOf("Type=Boot\nType=Application\nVersion Number=1\nVersion Number=2\n"), "2");
    EXPECT_EQ(versionOf("Type=Application\nVersion Number=1\nType=Boot\n"), "");
}

// Rules: VER-16
TEST_F(VersionSelectionTest, FirstApplicationInListingOrderWins) {
    const std::vector<std::string> names = {"d.inf", "a.inf", "h.inf", "b.inf",
                                            "g.inf", "c.inf", "f.inf", "e.inf"};
    for (const bool reversed : {false, true}) {
        putFolder(VERSION_FOLDER);
        std::vector<std::string> order = names;
        if (reversed) {
            order.assign(names.rbegin(), names.rend());
        }
        makeFiles(order);
        for (const std::string& name : names) {
            put(name, description("Application", name));
        }
        EXPECT_EQ(findApplicationVersion(), listing().front());
        EXPECT_EQ(findApplicationVersion(), listing().front());
    }
}

TEST_F(VersionSelectionTest, ListingOrderHoldsForNamesInAscendingAndDescendingOrder) {
    const std::vector<std::string> names = {"1.inf", "2.inf", "3.inf", "4.inf", "5.inf", "6.inf"};
    for (const bool descending : {false, true}) {
        putFolder(VERSION_FOLDER);
        std::vector<std::string> order = names;
        if (descending) {
            order.assign(names.rbegin(), names.rend());
        }
        for (const std::string& name : order) {
            put(name, description("Application", name));
        }
        EXPECT_EQ(findApplicationVersion(), listing().front());
    }
}

// Rules: VER-16
TEST_F(VersionSelectionTest, LowerVersionWinsWhenListedFirst) {
    const std::vector<std::string> listed = makeFiles({"x.inf", "y.inf"});
    put(listed.at(0), description("Application", "1.0.0"));
    put(listed.at(1), description("Application", "9.0.0"));
    EXPECT_EQ(findApplicationVersion(), "1.0.0");
    put(listed.at(0), description("Application", "9.0.0"));
    put(listed.at(1), description("Application", "1.0.0"));
    EXPECT_EQ(findApplicationVersion(), "9.0.0");
}

TEST_F(VersionSelectionTest, FilesOfOtherTypesAreSkipped) {
    const std::vector<std::string> listed = makeFiles({"x.inf", "y.inf", "z.inf"});
    put(listed.at(0), description("Bootloader", "1.0.0"));
    put(listed.at(1), "Version Number=2.0.0\n");
    put(listed.at(2), description("Application", "3.0.0"));
    EXPECT_EQ(findApplicationVersion(), "3.0.0");
}

// Rules: VER-17, VER-21
TEST_F(VersionSelectionTest, FirstMatchEndsTheSearchEvenWithoutAVersion) {
    for (const char* content :
         {"Type=Application\n", "Type=Application\nVersion Number=\n",
          "Type=Application\nVersion Number=   \n", "Type=Application\nVersion Number=TAG_\n"}) {
        SCOPED_TRACE(content);
        putFolder(VERSION_FOLDER);
        const std::vector<std::string> listed = makeFiles({"x.inf", "y.inf"});
        put(listed.at(0), content);
        put(listed.at(1), description("Application", "1.2.3"));
        EXPECT_EQ(findApplicationVersion(), "");
        EXPECT_EQ(softwareVersion(), "000000");
    }
}

// Rules: VER-17
TEST_F(VersionSelectionTest, FirstMatchEndsTheSearchEvenWithThePlaceholder) {
    const std::vector<std::string> listed = makeFiles({"x.inf", "y.inf"});
    put(listed.at(0), description("Application", "N/A"));
    put(listed.at(1), description("Application", "1.2.3"));
    EXPECT_EQ(findApplicationVersion(), "N/A");
    EXPECT_EQ(softwareVersion(), "000000");
}

// Rules: VER-18
TEST_F(VersionSelectionTest, EachFileHasItsOwnRecord) {
    const std::vector<std::string> listed = makeFiles({"x.inf", "y.inf"});
    put(listed.at(0), "Version Number=1.2.3\n");
    put(listed.at(1), "Type=Application\n");
    EXPECT_EQ(findApplicationVersion(), "");
    put(listed.at(0), "Type=Application\n");
    put(listed.at(1), "Version Number=1.2.3\n");
    EXPECT_EQ(findApplicationVersion(), "");
}

// Rules: VER-22
TEST_F(VersionSelectionTest, FoldersAndDanglingLinksWithTheMarkerAreHarmless) {
    std::filesystem::create_directory(pathOf("x.inf"));
    std::filesystem::create_symlink("/tmp/nowhere", pathOf("y.inf"));
    std::filesystem::create_symlink(pathOf("z.inf"), pathOf("z.inf"));
    EXPECT_EQ(findApplicationVersion(), "");
    put("app.inf", description("Application", "1.2.3"));
    EXPECT_EQ(findApplicationVersion(), "1.2.3");
}

TEST_F(VersionSelectionTest, LinkIsFollowed) {
    writeFile("/tmp/elsewhere", description("Application", "1.2.3"));
    std::filesystem::create_symlink("/tmp/elsewhere", pathOf("app.inf"));
    EXPECT_EQ(findApplicationVersion(), "1.2.3");
}

} // namespace orvane::test
