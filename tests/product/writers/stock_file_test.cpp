// SPDX-License-Identifier: Apache-2.0
#include "tests/product/writers/accessory_paths.h"
#include "tests/support/file_event_log.h"
#include "tests/support/input_lengths.h"
#include "tests/support/resource_limit.h"
#include "tests/support/unit_test.h"
#include "writers/template_merge.h"

#include <filesystem>
#include <iterator>
#include <string>
#include <vector>

namespace orvane::test {

namespace {

class StockFileTest : public UnitTest {
protected:
    StockFileTest() {
        writeFile(TEMPLATE, "template\n");
        writeFile(STOCK, "stock\n");
    }
};

} // namespace

TEST_F(StockFileTest, BecomesTheOutput) {
    installStockFile(ACCESSORY_FILE);
    EXPECT_EQ(readFile(OUTPUT), "stock\n");
    EXPECT_EQ(readFile(STOCK), "stock\n");
}

TEST_F(StockFileTest, ReplacesAnOlderLongerOutput) {
    writeFile(OUTPUT, std::string(20000, 'o'));
    installStockFile(ACCESSORY_FILE);
    EXPECT_EQ(readFile(OUTPUT), "stock\n");
}

// Rules: MRG-08
TEST_F(StockFileTest, IsCopiedByteForByte) {
    const std::string anyBytes("\0\r\n\x1a\xff no line end", 17);
    const std::string longText = anyBytes + markedText(LONGER_THAN_ANY_BUFFER);
    std::vector<std::size_t> lengths{1, 17, 511, 4096, 8192, longText.size()};
    lengths.insert(lengths.end(), std::begin(INPUT_LENGTHS), std::end(INPUT_LENGTHS));
    for (const std::size_t length : lengths) {
        SCOPED_TRACE(length);
        const std::string stock = longText.substr(0, length);
        writeFile(STOCK, stock);
        installStockFile(ACCESSORY_FILE);
        EXPECT_TRUE(readFile(OUTPUT) == stock);
    }
}

TEST_F(StockFileTest, UsesItsOwnStreams) {
    {
        const TemplateMerge merge(ACCESSORY_FILE);
        installStockFile(ACCESSORY_FILE);
        EXPECT_TRUE(merge.output.is_open());
        EXPECT_TRUE(merge.templateFile.is_open());
        EXPECT_EQ(decideMerge(merge.templateFile, merge.output), MergeDecision::generate);
        EXPECT_EQ(readFile(OUTPUT), "stock\n");
    }
    EXPECT_EQ(readFile(OUTPUT), "stock\n");
}

// Rules: MRG-09
TEST_F(StockFileTest, MissingLeavesAnEmptyOutput) {
    remove(STOCK);
    writeFile(OUTPUT, "older");
    installStockFile(ACCESSORY_FILE);
    EXPECT_EQ(readFile(OUTPUT), "");
}

TEST_F(StockFileTest, MissingStillCreatesTheOutput) {
    remove(STOCK);
    installStockFile(ACCESSORY_FILE);
    EXPECT_EQ(readFile(OUTPUT), "");
}

// Rules: MRG-09
TEST_F(StockFileTest, EmptyLeavesAnEmptyOutput) {
    writeFile(STOCK, "");
    writeFile(OUTPUT, "older");
    installStockFile(ACCESSORY_FILE);
    EXPECT_EQ(readFile(OUTPUT), "");
}

// Rules: MRG-09
TEST_F(StockFileTest, FolderInItsPlaceLeavesAnEmptyOutput) {
    putFolder(STOCK);
    writeFile(std::string(STOCK) + "/inner", "inner");
    writeFile(OUTPUT, "older");
    installStockFile(ACCESSORY_FILE);
    EXPECT_EQ(readFile(OUTPUT), "");
}

// Rules: RUN-11
TEST_F(StockFileTest, LeavesAnOutputThatIsAFolderEmpty) {
    putFolder(OUTPUT);
    installStockFile(ACCESSORY_FILE);
    EXPECT_TRUE(std::filesystem::is_empty(OUTPUT));
}

// Rules: RUN-12
TEST_F(StockFileTest, DoesNotCreateTheOutputsFolder) {
    remove("/tmp");
    installStockFile(ACCESSORY_FILE);
    EXPECT_FALSE(exists("/tmp"));
}

TEST_F(StockFileTest, IsOpenedBeforeTheOutput) {
    writeFile(OUTPUT, "older");
    {
        const rlim_t roomForOne = roomForDescriptors(1);
        const ResourceLimit limit(RLIMIT_NOFILE, roomForOne);
        installStockFile(ACCESSORY_FILE);
    }
    EXPECT_EQ(readFile(OUTPUT), "older");
}

TEST_F(StockFileTest, IsClosedBeforeTheOutput) {
    writeFile(OUTPUT, "older");
    FileEventLog closes(IN_CLOSE, {OUTPUT, STOCK});
    installStockFile(ACCESSORY_FILE);
    EXPECT_EQ(closes.take(), (std::vector<std::string>{STOCK, OUTPUT}));
}

// Rules: RUN-10
TEST_F(StockFileTest, GoesThroughASymlink) {
    std::filesystem::create_symlink("/fs/rwdata/target", OUTPUT);
    installStockFile(ACCESSORY_FILE);
    EXPECT_EQ(readFile("/fs/rwdata/target"), "stock\n");
    EXPECT_TRUE(std::filesystem::is_symlink(OUTPUT));
}

TEST_F(StockFileTest, ClosesWhatItOpened) {
    const int before = openDescriptors();
    installStockFile(ACCESSORY_FILE);
    remove(STOCK);
    installStockFile(ACCESSORY_FILE);
    putFolder(OUTPUT);
    installStockFile(ACCESSORY_FILE);
    EXPECT_EQ(openDescriptors(), before);
}

} // namespace orvane::test
