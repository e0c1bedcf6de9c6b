// SPDX-License-Identifier: Apache-2.0
#include "kit/description/parse_description.h"
#include "kit/description/sample.h"
#include "kit/description/unit_description.h"
#include "kit/host/kit_error.h"
#include "kit/unit/make_unit.h"
#include "tests/support/temporary_folder.h"
#include "tests/support/unit_test.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <string>

namespace orvane::test {

namespace {

/// The document's TOML block, as a reader would copy it.
std::string documentedExample() {
    const std::string text = readFile(ORVANE_DOCS_DIR "/unit-description.md");
    const std::string open = "```toml\n";
    const std::size_t begin = text.find(open) + open.size();
    return text.substr(begin, text.find("```", begin) - begin);
}

TEST(UnitDescription, DocumentedExampleIsAUnit) {
    const TemporaryFolder folder;
    const std::filesystem::path root = folder.path() / "unit";
    kit::makeUnit(kit::parseDescription(documentedExample(), "example"), root);
    EXPECT_EQ(readFile(root / "fs/mp/etc/airplay_static.conf"), "airplay = yes\n");
    EXPECT_EQ(readFile(root / "fs/mp/etc/iap2_device_static.cfg"), std::string(8192, 'x'));
    EXPECT_EQ(readFile(root / "fs/rwdata/.Version/app.inf"), "Type");
    EXPECT_EQ(readFile(root / "fs/rwdata/blank"), std::string(4096, '\xFF'));
    EXPECT_EQ(readFile(root / "tmp/iap1.cfg"), "old\n");
    EXPECT_EQ(readFile(root / "fs/rwdata/disk1"),
              std::string(512, '\0') + "\x55\xAA" + std::string(65022, '\0'));
    EXPECT_EQ(std::filesystem::read_symlink(root / "tmp/iap2.cfg"), "/fs/rwdata/iap2.cfg");
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

TEST(UnitDescription, FolderThatIsNotEmptyIsRefused) {
    const TemporaryFolder folder;
    writeFile(folder.path() / "mine", "kept");
    EXPECT_THROW(kit::makeUnit({}, folder.path()), kit::KitError);
    EXPECT_EQ(readFile(folder.path() / "mine"), "kept");
}

} // namespace

} // namespace orvane::test
