// SPDX-License-Identifier: Apache-2.0
#include "kit/unit.h"
#include "tests/support/temporary_folder.h"
#include "tests/support/unit_test.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <string>

namespace orvane::test {

namespace {

/// The TOML block of the document, as a reader would copy it.
std::string documentedExample() {
    const std::string text = readFile(ORVANE_DOCS_DIR "/unit-description.md");
    const std::string open = "```toml\n";
    const std::size_t begin = text.find(open) + open.size();
    return text.substr(begin, text.find("```", begin) - begin);
}

TEST(UnitDescription, ExampleOfTheDocumentIsAUnit) {
    const TemporaryFolder folder;
    const std::filesystem::path root = folder.path() / "unit";
    kit::makeUnit(kit::parseDescription(documentedExample(), "example"), root);
    EXPECT_EQ(readFile(root / "fs/mp/etc/airplay_static.conf"), "airplay = yes\n");
    EXPECT_EQ(readFile(root / "fs/mp/etc/iap2_device_static.cfg"), std::string(8192, 'x'));
    EXPECT_TRUE(std::filesystem::is_directory(root / "tmp/airplay.conf"));
    EXPECT_FALSE(std::filesystem::exists(root / "fs/mp/etc/mm"));
    EXPECT_EQ(readFile(root / "fs/tmpfs/VS_DIAG_SERVICE_CONFIG_SHARED_MEM").substr(133, 7),
              std::string("\xFF\xFF\0\0\0\0\x2F", 7));
    EXPECT_EQ(std::filesystem::file_size(root / "dev/hd0"), 2U * 1024 * 1024);
}

TEST(UnitDescription, SampleIsAUnit) {
    const TemporaryFolder folder;
    const std::filesystem::path root = folder.path() / "unit";
    kit::makeUnit(kit::parseDescription(kit::sampleDescriptionText(), "sample"), root);
    EXPECT_TRUE(std::filesystem::exists(root / "fs/mp/etc/airplay_static.conf"));
}

/// A text that is refused, and the beginning of what is said of it.
struct Refusal {
    const char* text;
    const char* message;
};

const Refusal REFUSALS[] = {
    {"[image.params]\n134 = 70000\n", "unit.toml:2:"},
    {"[image.params]\n172 = 1\n", "unit.toml:2:"},
    {"[image.params]\n22 = 256\n", "unit.toml:2:"},
    {"[imago]\n", "unit.toml:1:"},
    {"[disk.slots]\n18 = \"x\"\n", "unit.toml:2:"},
    {"[disk.slots]\n9 = \"123456789\"\n", "unit.toml:2:"},
    {"[disk.tuning.10]\n", "unit.toml:1:"},
    {"[disk.tuning.2]\nqwaNone = 1\n", "unit.toml:2:"},
    {"[disk.tuning.2]\nqwaAECSwitch = \"on\"\n", "unit.toml:2:"},
    {"[disk.tuning.2]\nqwaNRAtten = 32768\n", "unit.toml:2:"},
    {"[disk.tuning.2]\nqwaNCParams = [1, 2]\n", "unit.toml:2:"},
    {"[disk.tuning.2]\nraw = \"4\"\n", "unit.toml:2:"},
    {"[files]\n\"relative\" = \"\"\n", "unit.toml:2:"},
    {"[files\n", "unit.toml:1:"},
};

TEST(UnitDescription, RefusalNamesThePlace) {
    for (const Refusal& refusal : REFUSALS) {
        SCOPED_TRACE(refusal.text);
        try {
            kit::parseDescription(refusal.text, "unit.toml");
            ADD_FAILURE() << "accepted";
        } catch (const kit::KitError& error) {
            EXPECT_EQ(std::string(error.what()).rfind(refusal.message, 0), 0U) << error.what();
        }
    }
}

TEST(UnitDescription, FailedUnitLeavesNothing) {
    const TemporaryFolder folder;
    const std::filesystem::path root = folder.path() / "unit";
    const kit::UnitDescription tooSmall =
        kit::parseDescription("[disk]\nsize = 10\n[disk.slots]\n9 = \"x\"\n", "unit.toml");
    EXPECT_THROW(kit::makeUnit(tooSmall, root), kit::KitError);
    EXPECT_FALSE(std::filesystem::exists(root));
}

TEST(UnitDescription, FolderThatIsNotEmptyIsRefused) {
    const TemporaryFolder folder;
    writeFile(folder.path() / "mine", "kept");
    EXPECT_THROW(kit::makeUnit({}, folder.path()), kit::KitError);
    EXPECT_EQ(readFile(folder.path() / "mine"), "kept");
}

} // namespace

} // namespace orvane::test
