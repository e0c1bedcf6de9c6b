// SPDX-License-Identifier: Apache-2.0
#include "tests/product/writers/accessory_paths.h"
#include "tests/support/file_event_log.h"
#include "tests/support/input_lengths.h"
#include "tests/support/resource_limit.h"
#include "tests/support/unit_test.h"
#include "writers/template_merge.h"

#include <sys/stat.h>

#include <filesystem>
#include <iterator>
#include <string>
#include <utility>
#include <vector>

namespace orvane::test {

namespace {

class TemplateMergeTest : public UnitTest {
protected:
    TemplateMergeTest() { writeFile(TEMPLATE, "template\n"); }

    static mode_t modeOf(const std::string& path) {
        struct stat status {};
        EXPECT_EQ(::stat(path.c_str(), &status), 0) << path;
        return status.st_mode & 07777U;
    }
};

/// A merge of ACCESSORY_FILE whose streams are open.
struct OpenMerge : TemplateMerge {
    OpenMerge() : TemplateMerge(ACCESSORY_FILE) {}
    MergeDecision decision() const { return decideMerge(templateFile, output); }
};

/// A whole merge, with text before and after the template.
void mergeBetween(const std::string& before, const std::string& after) {
    OpenMerge merge;
    merge.output << before;
    copyBytes(merge.templateFile, merge.output);
    merge.output << after;
    merge.close();
}

} // namespace

// Rules: MRG-02
TEST_F(TemplateMergeTest, AppendsTheTemplateToWhatWasWritten) {
    mergeBetween("before\n", "after\n");
    EXPECT_EQ(readFile(OUTPUT), "before\ntemplate\nafter\n");
}

TEST_F(TemplateMergeTest, CanGenerateWhenBothAreOpen) {
    const OpenMerge merge;
    EXPECT_EQ(merge.decision(), MergeDecision::generate);
    EXPECT_TRUE(merge.output.is_open());
    EXPECT_TRUE(merge.templateFile.is_open());
}

TEST_F(TemplateMergeTest, CannotGenerateWithoutATemplate) {
    remove(TEMPLATE);
    const OpenMerge merge;
    EXPECT_EQ(merge.decision(), MergeDecision::templateFailed);
    EXPECT_TRUE(merge.templateFile.fail());
    EXPECT_FALSE(merge.output.fail());
}

TEST_F(TemplateMergeTest, CannotGenerateWithoutAnOutput) {
    putFolder(OUTPUT);
    const OpenMerge merge;
    EXPECT_EQ(merge.decision(), MergeDecision::outputFailed);
    EXPECT_FALSE(merge.templateFile.fail());
    EXPECT_TRUE(merge.output.fail());
}

TEST_F(TemplateMergeTest, CannotGenerateWithoutEither) {
    remove(TEMPLATE);
    putFolder(OUTPUT);
    const OpenMerge merge;
    EXPECT_EQ(merge.decision(), MergeDecision::templateFailed);
}

TEST_F(TemplateMergeTest, CanGenerateFromATemplateThatIsAFolder) {
    putFolder(TEMPLATE);
    const OpenMerge merge;
    EXPECT_EQ(merge.decision(), MergeDecision::generate);
}

TEST_F(TemplateMergeTest, CannotGenerateOnceAStreamHasFailed) {
    OpenMerge merge;
    merge.output.setstate(std::ios::badbit);
    EXPECT_EQ(merge.decision(), MergeDecision::outputFailed);
    merge.output.clear();
    merge.templateFile.setstate(std::ios::badbit);
    EXPECT_EQ(merge.decision(), MergeDecision::templateFailed);
    merge.templateFile.clear();
    EXPECT_EQ(merge.decision(), MergeDecision::generate);
}

TEST_F(TemplateMergeTest, StockFileIsNeededUnlessTheFileIsGenerated) {
    EXPECT_FALSE(needsStockFile(MergeDecision::generate));
    EXPECT_TRUE(needsStockFile(MergeDecision::templateFailed));
    EXPECT_TRUE(needsStockFile(MergeDecision::outputFailed));
    EXPECT_TRUE(needsStockFile(MergeDecision::iap2Failed));
}

TEST_F(TemplateMergeTest, TemplateReadToItsEndStillCounts) {
    OpenMerge merge;
    merge.templateFile.setstate(std::ios::eofbit);
    EXPECT_EQ(merge.decision(), MergeDecision::generate);
}

TEST_F(TemplateMergeTest, OutputIsOpenedFirst) {
    const rlim_t roomForOne = roomForDescriptors(1);
    const ResourceLimit limit(RLIMIT_NOFILE, roomForOne);
    const OpenMerge merge;
    EXPECT_TRUE(merge.output.is_open());
    EXPECT_FALSE(merge.templateFile.is_open());
}

// Rules: MRG-01
TEST_F(TemplateMergeTest, TemplateIsOpenedLastAndClosedFirst) {
    writeFile(OUTPUT, "older");
    FileEventLog opens(IN_OPEN, {OUTPUT, TEMPLATE});
    FileEventLog closes(IN_CLOSE, {OUTPUT, TEMPLATE});
    OpenMerge merge;
    merge.close();
    EXPECT_EQ(opens.take(), (std::vector<std::string>{OUTPUT, TEMPLATE}));
    EXPECT_EQ(closes.take(), (std::vector<std::string>{TEMPLATE, OUTPUT}));
}

// Rules: MRG-01
TEST_F(TemplateMergeTest, OutputIsTruncatedAtOnce) {
    writeFile(OUTPUT, "older");
    const OpenMerge merge;
    EXPECT_EQ(readFile(OUTPUT), "");
}

TEST_F(TemplateMergeTest, OutputIsTruncatedWithoutATemplateToo) {
    remove(TEMPLATE);
    writeFile(OUTPUT, "older");
    { const OpenMerge merge; }
    EXPECT_EQ(readFile(OUTPUT), "");
}

// Rules: RUN-09
TEST_F(TemplateMergeTest, OlderLongerOutputIsReplacedWhole) {
    writeFile(OUTPUT, std::string(20000, 'o'));
    mergeBetween("before\n", "");
    EXPECT_EQ(readFile(OUTPUT), "before\ntemplate\n");
}

// Rules: RUN-07
TEST_F(TemplateMergeTest, NewOutputHasMode666LessTheMask) {
    for (const auto& [mask, mode] : {std::pair<mode_t, mode_t>{0, 0666}, {027, 0640}}) {
        remove(OUTPUT);
        const mode_t former = umask(mask);
        { const OpenMerge merge; }
        umask(former);
        EXPECT_EQ(modeOf(OUTPUT), mode) << mask;
    }
}

// Rules: RUN-08
TEST_F(TemplateMergeTest, OlderOutputStaysTheSameFile) {
    writeFile(OUTPUT, "older");
    std::filesystem::create_hard_link(OUTPUT, "/tmp/other-name");
    ASSERT_EQ(chmod(OUTPUT, 0600), 0);
    mergeBetween("", "");
    EXPECT_EQ(readFile("/tmp/other-name"), "template\n");
    EXPECT_EQ(modeOf(OUTPUT), 0600U);
}

// Rules: RUN-10
TEST_F(TemplateMergeTest, OutputThroughASymlinkReachesItsTarget) {
    std::filesystem::create_symlink("/fs/rwdata/target", OUTPUT);
    mergeBetween("", "");
    EXPECT_EQ(readFile("/fs/rwdata/target"), "template\n");
    EXPECT_TRUE(std::filesystem::is_symlink(OUTPUT));
}

// Rules: MRG-03, MRG-04
TEST_F(TemplateMergeTest, CopiesEveryByteOfAnyTemplate) {
    std::string allBytes;
    for (int byte = 0; byte < 256; ++byte) {
        allBytes.push_back(static_cast<char>(byte));
    }
    for (const std::string& content :
         {std::string("x"), std::string(1, '\0'), std::string("\n"), std::string("no line end"),
          std::string("a\r\nb\x1a\r\n"), std::string("\xEF\xBB\xBFtext\n"), allBytes}) {
        SCOPED_TRACE(content);
        writeFile(TEMPLATE, content);
        mergeBetween("<", ">");
        EXPECT_EQ(readFile(OUTPUT), "<" + content + ">");
    }
}

// Rules: MRG-03
TEST_F(TemplateMergeTest, CopiesTemplatesOfAnyLength) {
    std::vector<std::size_t> lengths{511,  512,  1023, 1024, 4095, 4096,
                                     4097, 8190, 8191, 8192, 8193, 16384};
    lengths.insert(lengths.end(), std::begin(INPUT_LENGTHS), std::end(INPUT_LENGTHS));
    lengths.push_back(LONGER_THAN_ANY_BUFFER);
    for (const std::size_t length : lengths) {
        SCOPED_TRACE(length);
        const std::string content = markedText(length);
        writeFile(TEMPLATE, content);
        mergeBetween("<", ">");
        EXPECT_TRUE(readFile(OUTPUT) == "<" + content + ">");
    }
}

TEST_F(TemplateMergeTest, CopiesOnlyWhatRemainsOfTheTemplate) {
    OpenMerge merge;
    ASSERT_EQ(merge.templateFile.get(), 't');
    copyBytes(merge.templateFile, merge.output);
    merge.close();
    EXPECT_EQ(readFile(OUTPUT), "emplate\n");
}

TEST_F(TemplateMergeTest, CopyOfSomethingLeavesTheOutputGood) {
    OpenMerge merge;
    copyBytes(merge.templateFile, merge.output);
    EXPECT_FALSE(merge.output.fail());
    merge.close();
    EXPECT_FALSE(merge.output.fail());
    EXPECT_FALSE(merge.templateFile.fail());
}

// Rules: MRG-05
TEST_F(TemplateMergeTest, EmptyTemplateEndsTheOutput) {
    writeFile(TEMPLATE, "");
    OpenMerge merge;
    merge.output << "before\n";
    copyBytes(merge.templateFile, merge.output);
    EXPECT_TRUE(merge.output.fail());
    merge.output << "after\n";
    merge.close();
    EXPECT_TRUE(merge.output.fail());
    EXPECT_EQ(readFile(OUTPUT), "before\n");
}

TEST_F(TemplateMergeTest, AbsentTemplateEndsTheOutput) {
    remove(TEMPLATE);
    OpenMerge merge;
    merge.output << "before\n";
    copyBytes(merge.templateFile, merge.output);
    EXPECT_TRUE(merge.output.fail());
    merge.output << "after\n";
    merge.close();
    EXPECT_EQ(readFile(OUTPUT), "before\n");
}

// Rules: MRG-06
TEST_F(TemplateMergeTest, FolderAsATemplateEndsTheOutput) {
    putFolder(TEMPLATE);
    writeFile(std::string(TEMPLATE) + "/inner", "inner");
    OpenMerge merge;
    merge.output << "before\n";
    copyBytes(merge.templateFile, merge.output);
    EXPECT_TRUE(merge.output.fail());
    merge.output << "after\n";
    merge.close();
    EXPECT_EQ(readFile(OUTPUT), "before\n");
}

// Rules: MRG-10
TEST_F(TemplateMergeTest, CopyIntoAnOutputThatIsNotOpenWritesNowhere) {
    putFolder(OUTPUT);
    mergeBetween("before\n", "after\n");
    EXPECT_TRUE(std::filesystem::is_empty(OUTPUT));
    EXPECT_EQ(readFile(TEMPLATE), "template\n");
}

TEST_F(TemplateMergeTest, CloseClosesBoth) {
    const int before = openDescriptors();
    OpenMerge merge;
    EXPECT_EQ(openDescriptors(), before + 2);
    merge.close();
    EXPECT_FALSE(merge.output.is_open());
    EXPECT_FALSE(merge.templateFile.is_open());
    EXPECT_EQ(openDescriptors(), before);
}

TEST_F(TemplateMergeTest, CloseFailsTheOutputThatCannotBeWrittenWhole) {
    OpenMerge merge;
    merge.output << std::string(1000, 'x');
    EXPECT_FALSE(merge.output.fail());
    {
        const ResourceLimit limit(RLIMIT_FSIZE, 100);
        merge.close();
    }
    EXPECT_TRUE(merge.output.fail());
    EXPECT_FALSE(merge.templateFile.fail());
    EXPECT_EQ(readFile(OUTPUT), std::string(100, 'x'));
}

TEST_F(TemplateMergeTest, CopyThatCannotBeWrittenWholeEndsWhereTheWriteFailed) {
    // In the middle of what the first, the second and the third read gives.
    const std::string content = markedText(INPUT_LENGTHS[7]);
    writeFile(TEMPLATE, content);
    for (const std::size_t room : {100000U, 200000U, 290000U}) {
        SCOPED_TRACE(room);
        {
            const ResourceLimit limit(RLIMIT_FSIZE, room);
            mergeBetween("<", "");
        }
        EXPECT_TRUE(readFile(OUTPUT) == ("<" + content).substr(0, room));
    }
}

TEST_F(TemplateMergeTest, DestructionClosesBoth) {
    const int before = openDescriptors();
    { const OpenMerge merge; }
    EXPECT_EQ(openDescriptors(), before);
}

} // namespace orvane::test
