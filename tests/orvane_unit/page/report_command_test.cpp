// SPDX-License-Identifier: Apache-2.0
//
// The command `report`: the units that it finds, serials, and errors.
#include "kit/unit/make_unit.h"
#include "orvane_unit/page/page_units.h"
#include "tests/kit/unit/described_unit.h"
#include "tests/orvane_unit/orvane_unit_command.h"
#include "tests/support/folder_names.h"
#include "tests/support/temporary_folder.h"
#include "tests/support/unit_test.h"

#include <gtest/gtest.h>
#include <sys/stat.h>

#include <filesystem>
#include <functional>
#include <set>
#include <string>
#include <vector>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;

using Names = std::set<std::string>;

/// A folder for units, descriptions and pages.
class ReportCommandTest : public ::testing::Test {
protected:
    const fs::path& folder() const { return folder_.path(); }
    fs::path page() const { return folder() / "page.html"; }

    /// Makes a unit at `name` in the folder.
    fs::path makeUnit(
        const std::string& name, const std::function<void(kit::UnitDescription&)>& change =
                                     [](kit::UnitDescription&) {}) const {
        kit::UnitDescription unit = kit::parseDescription(WHOLE_UNIT, "whole unit");
        change(unit);
        kit::makeUnit(unit, folder() / name);
        return folder() / name;
    }

    /// Runs the command with `words`, which has to end with `status`. Returns what it complains of.
    std::string report(const Words& words, int status) const {
        const kit::RunResult result =
            runOrvaneUnit(Words{"report"} + words + Words{"-o", page().string()});
        EXPECT_EQ(result.exitStatus, status) << result.standardError;
        EXPECT_EQ(result.standardOutput, "");
        EXPECT_EQ(fs::exists(page()), status != 2);
        return result.standardError;
    }

    std::string text() const { return readFile(page()); }

    bool hasText(const std::string& what) const { return text().find(what) != std::string::npos; }

private:
    TemporaryFolder folder_;
};

/// The names of the units that the command finds.
std::vector<std::string> found(const std::vector<std::string>& roots) {
    std::vector<std::string> names;
    std::size_t last = 0;
    for (const desk::PageUnit& unit : desk::readPageUnits(
             {roots, "a", false, false}, [&last](std::size_t done, std::size_t all) {
                 EXPECT_EQ(done, last + 1);
                 EXPECT_LE(done, all);
                 last = done;
             })) {
        names.push_back(unit.name);
        EXPECT_EQ(unit.explanation.size(), 3U);
        EXPECT_FALSE(unit.impacts);
    }
    EXPECT_EQ(last, names.size() > 1 ? names.size() : 0);
    return names;
}

TEST_F(ReportCommandTest, StatusTellsWhetherAllIsAsIntended) {
    const fs::path root = makeUnit("bench");
    EXPECT_EQ(report({root}, 0), "");
    fs::remove(root / "fs/mp/etc/airplay_static.conf");
    EXPECT_EQ(report({root}, 1), "");
    EXPECT_TRUE(hasText("1 of 6 outputs is not as intended."));
    EXPECT_EQ(report({root, "-i"}, 0), "");
    EXPECT_TRUE(hasText("What orvane -i writes, and why"));
    EXPECT_FALSE(hasText("data-path=\"/tmp/airplay.conf\""));
    EXPECT_EQ(folderNames(folder()), (Names{"bench", "page.html"}));
}

TEST_F(ReportCommandTest, UnitIsOnlyRead) {
    const fs::path root = makeUnit("bench");
    const std::string state = runOrvaneUnit({"describe", root}).standardOutput;
    report({root, "--redact-serial"}, 0);
    EXPECT_EQ(runOrvaneUnit({"describe", root}).standardOutput, state);
}

TEST_F(ReportCommandTest, FolderStandsForItsUnitsAndDescriptions) {
    fs::create_directory(folder() / "fleet");
    makeUnit("fleet/b");
    makeUnit("fleet/c");
    fs::create_directory(folder() / "fleet/no unit");
    writeFile(folder() / "fleet/a.toml", WHOLE_UNIT);
    writeFile(folder() / "fleet/notes.txt", "");
    const std::string fleet = folder() / "fleet";
    EXPECT_EQ(found({fleet}), (std::vector<std::string>{"a.toml", "b", "c"}));
    EXPECT_EQ(found({fleet + "/c", fleet + "/a.toml"}),
              (std::vector<std::string>{fleet + "/c", fleet + "/a.toml"}));
    EXPECT_EQ(
        found({fleet, fleet + "/b"}),
        (std::vector<std::string>{fleet + "/a.toml", fleet + "/b", fleet + "/c", fleet + "/b"}));
    EXPECT_EQ(report({fleet}, 0), "");
    EXPECT_TRUE(hasText("<a href=\"#unit-1\">a.toml</a>"));
}

TEST_F(ReportCommandTest, UnitThatNobodyMarkedIsRead) {
    const fs::path root = makeUnit("mounted");
    fs::remove(root / ".orvane-unit");
    EXPECT_EQ(report({root}, 0), "");
}

TEST_F(ReportCommandTest, RedactedSerialStandsNowhere) {
    const fs::path root = makeUnit("SN004217", [](kit::UnitDescription& unit) {
        unit.files["/fs/rwdata/.Version/SN004217.inf"] = "Type=Boot\nName=of SN004217\n";
        unit.files["/fs/mp/etc/airplay_static.conf"] = "# SN004217\n";
        unit.image.bytes[150] = "SN004217";
        unit.disk.aux = "SN004217SN004217";
    });
    report({root}, 0);
    EXPECT_TRUE(hasText("SN004217"));
    EXPECT_TRUE(hasText("53 4e 30 30 34 32 31 37"));
    report({root, "--redact-serial"}, 0);
    EXPECT_FALSE(hasText("SN004217"));
    EXPECT_FALSE(hasText("53 4e 30 30 34 32 31 37"));
    EXPECT_TRUE(hasText("<code>serial=XXXXXXXX</code>"));
    EXPECT_TRUE(hasText("XXXXXXXX</h2>"));
    EXPECT_TRUE(hasText("/fs/rwdata/.Version/XXXXXXXX.inf"));
}

TEST_F(ReportCommandTest, SerialsOfAllUnitsAreRedactedInTheirNames) {
    const fs::path first = makeUnit(
        "first of SN000002", [](kit::UnitDescription& unit) { unit.disk.slots[9] = "SN000001"; });
    const fs::path second = makeUnit(
        "second of SN000001", [](kit::UnitDescription& unit) { unit.disk.slots[9] = "SN000002"; });
    report({first, second, "--redact-serial"}, 0);
    EXPECT_FALSE(hasText("SN00000"));
    EXPECT_TRUE(hasText("second of XXXXXXXX"));
}

TEST_F(ReportCommandTest, SerialThatCannotBeRedactedIsAnError) {
    const fs::path root =
        makeUnit("bench", [](kit::UnitDescription& unit) { unit.disk.slots[9] = "abc"; });
    const std::string error = report({root, "--redact-serial"}, 2);
    EXPECT_EQ(error.find("orvane-unit: " + root.string() + ": "), 0U) << error;
    EXPECT_NE(error.find("a serial of 3 bytes"), std::string::npos) << error;
}

TEST_F(ReportCommandTest, ImpactIsSaidWhenAskedFor) {
    const std::vector<desk::PageUnit> units = desk::readPageUnits(
        {{makeUnit("bench", [](kit::UnitDescription& unit) { unit.absent = {"/dev/hd0"}; })},
         "a",
         false,
         true},
        [](std::size_t /*done*/, std::size_t /*all*/) {});
    ASSERT_EQ(units.size(), 1U);
    ASSERT_TRUE(units.front().impacts);
    EXPECT_EQ(units.front().impacts->size(), 171U);
}

TEST_F(ReportCommandTest, BadInputLeavesNoPage) {
    const std::string none = folder() / "none";
    EXPECT_EQ(report({none}, 2),
              "orvane-unit: cannot read " + none + ": No such file or directory\n");
    fs::create_directory(folder() / "bare");
    const std::string bare = folder() / "bare";
    EXPECT_EQ(report({bare}, 2),
              "orvane-unit: " + bare + " is not a unit: nothing that orvane opens is in it\n");
    const fs::path waits = makeUnit("waits", [](kit::UnitDescription& unit) {
        unit.absent = {"/fs/tmpfs/VS_DIAG_SERVICE_CONFIG_SHARED_MEM"};
    });
    ASSERT_EQ(::mkfifo((waits / "fs/tmpfs/VS_DIAG_SERVICE_CONFIG_SHARED_MEM").c_str(), 0666), 0);
    EXPECT_EQ(report({makeUnit("good"), waits}, 2).find("orvane-unit: " + waits.string() + ": "),
              0U);
    writeFile(folder() / "bad.toml", "[engine]\n");
    EXPECT_EQ(report({folder() / "bad.toml"}, 2)
                  .find("orvane-unit: " + folder().string() + "/bad.toml:1:"),
              0U);
    EXPECT_EQ(folderNames(folder()), (Names{"bad.toml", "bare", "good", "waits"}));
}

TEST_F(ReportCommandTest, ErrorNamesItsUnitOnce) {
    fs::create_directory(folder() / "fleet");
    makeUnit("fleet/good");
    const fs::path waits = makeUnit("fleet/waits");
    fs::remove(waits / "fs/mp/etc/airplay_static.conf");
    ASSERT_EQ(::mkfifo((waits / "fs/mp/etc/airplay_static.conf").c_str(), 0666), 0);
    const std::string description = folder() / "bad.toml";
    writeFile(description, "[disk]\nsize = -1\n");
    const std::string none = folder() / "none.toml";
    for (const std::string& source : {waits.string(), description, none}) {
        const std::string error = report({folder() / "fleet/good", source}, 2);
        EXPECT_NE(error.find(source), std::string::npos) << error;
        EXPECT_EQ(error.find(source), error.rfind(source)) << error;
    }
    EXPECT_EQ(report({folder() / "fleet"}, 2).find("orvane-unit: " + waits.string() + ": "), 0U);
}

TEST_F(ReportCommandTest, HugeUnitMakesASmallPage) {
    const std::string lineEnds(MEBIBYTE, '\n');
    const fs::path root = makeUnit("huge", [&lineEnds](kit::UnitDescription& unit) {
        unit.files["/fs/mp/etc/airplay_static.conf"] = lineEnds;
        unit.files["/fs/mp/etc/mm/iap2_static.cfg"] = lineEnds;
        unit.files["/fs/rwdata/.Version/app.inf"] =
            "Type=Application\nVersion Number=1." + std::string(MEBIBYTE, '&') + "\n";
    });
    EXPECT_EQ(report({root, "-a", "-i"}, 1), ""); // the version has too few components
    EXPECT_LT(fs::file_size(page()), MEBIBYTE);
    EXPECT_TRUE(hasText(" more lines ("));
    EXPECT_TRUE(hasText(" more bytes)"));
}

TEST_F(ReportCommandTest, PageThatCannotBeWrittenIsAnError) {
    const std::string root = makeUnit("bench");
    fs::create_directory(page());
    const kit::RunResult result = runOrvaneUnit({"report", root, "-o", page()});
    EXPECT_EQ(result.exitStatus, 2);
    EXPECT_EQ(result.standardError, "orvane-unit: cannot write " + page().string() +
                                        ": it is there and not a regular file\n");
    EXPECT_EQ(runOrvaneUnit({"report", root}).standardError, "orvane-unit: -o is required\n");
    EXPECT_EQ(folderNames(folder()), (Names{"bench", "page.html"}));
}

TEST_F(ReportCommandTest, OnlyAPageIsReplaced) {
    const fs::path root = makeUnit("bench");
    writeFile(folder() / "unit.toml", "");
    for (const fs::path& input :
         {folder() / "unit.toml", root / "dev/hd0", root / "fs/mp/etc/airplay_static.conf"}) {
        const std::string before = readFile(input);
        const kit::RunResult result = runOrvaneUnit({"report", root, "-o", input});
        EXPECT_EQ(result.exitStatus, 2);
        EXPECT_EQ(result.standardError,
                  "orvane-unit: " + input.string() + " is there and not a page: remove it first\n");
        EXPECT_EQ(readFile(input), before);
    }
    writeFile(page(), "<!DOCTYPE html><p>somebody's own");
    EXPECT_EQ(runOrvaneUnit({"report", root, "-o", page()}).exitStatus, 2);
    EXPECT_EQ(readFile(page()), "<!DOCTYPE html><p>somebody's own");
    fs::remove(page());
    report({root}, 0);
    report({root}, 0);
}

TEST_F(ReportCommandTest, PageInAUnitIsRefused) {
    const fs::path root = makeUnit("bench");
    fs::create_directory_symlink(root / "tmp", folder() / "way in");
    for (const fs::path& inside : {root / "tmp/airplay.conf", folder() / "way in/page.html"}) {
        const kit::RunResult result = runOrvaneUnit({"report", root, "-o", inside});
        EXPECT_EQ(result.exitStatus, 2);
        EXPECT_EQ(result.standardError, "orvane-unit: " + inside.string() + " is in the unit " +
                                            root.string() + ": a page would change it\n");
    }
    EXPECT_TRUE(fs::is_empty(root / "tmp"));
}

TEST_F(ReportCommandTest, RootThatIsNeitherAUnitNorADescriptionIsRefused) {
    const std::string pipe = folder() / "pipe.toml";
    ASSERT_EQ(::mkfifo(pipe.c_str(), 0666), 0);
    for (const std::string& root : {pipe, std::string("/dev/null"), folder().string()}) {
        EXPECT_NE(report({root}, 2).find(" is neither a unit nor a description\n"),
                  std::string::npos)
            << root;
    }
}

TEST_F(ReportCommandTest, UnmarkedUnitsOfAFolderCount) {
    fs::create_directory(folder() / "fleet");
    makeUnit("fleet/first");
    fs::remove(makeUnit("fleet/second") / ".orvane-unit");
    writeFile(folder() / "fleet/second/notes.toml", "");
    fs::create_directory(folder() / "fleet/notes");
    EXPECT_EQ(found({folder() / "fleet"}), (std::vector<std::string>{"first", "second"}));
    EXPECT_EQ(found({folder() / "fleet/second"}),
              (std::vector<std::string>{folder() / "fleet/second"}));
}

TEST_F(ReportCommandTest, SerialOfAnotherUnitIsAnError) {
    const fs::path first = makeUnit("first", [](kit::UnitDescription& unit) {
        unit.files["/fs/mp/etc/airplay_static.conf"] = "# from SN000002\n";
    });
    const fs::path second =
        makeUnit("second", [](kit::UnitDescription& unit) { unit.disk.slots[9] = "SN000002"; });
    EXPECT_NE(report({first, second, "--redact-serial"}, 2).find("airplay_static.conf"),
              std::string::npos);
}

TEST_F(ReportCommandTest, RedactedPageSaysSo) {
    const fs::path root = makeUnit("bench");
    report({root}, 0);
    EXPECT_FALSE(hasText("Serials are replaced by X"));
    report({root, "--redact-serial"}, 0);
    EXPECT_TRUE(hasText("Serials are replaced by X"));
}

} // namespace

} // namespace orvane::test
