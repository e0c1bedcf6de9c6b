// SPDX-License-Identifier: Apache-2.0
#include "kit/host/host_file.h"
#include "kit/host/kit_error.h"
#include "kit/host/sparse_content.h"
#include "tests/kit/description/random_unit.h"
#include "tests/support/temporary_folder.h"
#include "tests/support/unit_test.h"

#include <gtest/gtest.h>
#include <sys/stat.h>

#include <filesystem>
#include <string>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;

std::string zeros(std::size_t count) {
    return std::string(count, '\0');
}

class NonZeroRunsTest : public ::testing::Test {
protected:
    fs::path file() const { return folder_.path() / "file"; }

    kit::SparseContent runsOfFile() const {
        return kit::sparseContent(kit::openForReading(file()), file(), fs::file_size(file()));
    }

    /// The same from memory and from a file.
    void expectRuns(const std::string& content, const kit::SparseContent& expected) const {
        EXPECT_EQ(kit::sparseContent(content), expected);
        writeFile(file(), content);
        EXPECT_EQ(runsOfFile(), expected);
    }

private:
    TemporaryFolder folder_;
};

TEST_F(NonZeroRunsTest, EmptyContentHasNoRuns) {
    expectRuns("", {});
    expectRuns(zeros(1), {});
    expectRuns(zeros(100000), {});
}

TEST_F(NonZeroRunsTest, RunStartsAndEndsWithNonZeroBytes) {
    expectRuns("a", {{0, "a"}});
    expectRuns(zeros(3) + "ab" + zeros(40), {{3, "ab"}});
    expectRuns(zeros(5000) + "\xFF", {{5000, "\xFF"}});
}

TEST_F(NonZeroRunsTest, FifteenZerosArePartOfARunAndSixteenEndIt) {
    expectRuns("a" + zeros(15) + "b", {{0, "a" + zeros(15) + "b"}});
    expectRuns("a" + zeros(16) + "b", {{0, "a"}, {17, "b"}});
    expectRuns("a" + zeros(10) + "b" + zeros(10) + "c",
               {{0, "a" + zeros(10) + "b" + zeros(10) + "c"}});
}

TEST_F(NonZeroRunsTest, RunCrossesTheEdgesOfPagesAndReads) {
    for (const std::size_t edge : {std::size_t{4096}, std::size_t{0x40000}}) {
        expectRuns(zeros(edge - 2) + "abcd" + zeros(9), {{edge - 2, "abcd"}});
        expectRuns(zeros(edge - 1) + "a" + zeros(15) + "b", {{edge - 1, "a" + zeros(15) + "b"}});
        expectRuns(zeros(edge - 1) + "a" + zeros(16) + "b", {{edge - 1, "a"}, {edge + 16, "b"}});
    }
}

TEST_F(NonZeroRunsTest, OffsetsStartAtThePlaceOfTheBytes) {
    EXPECT_EQ(kit::sparseContent(zeros(2) + "a", 1000), (kit::SparseContent{{1002, "a"}}));
}

TEST_F(NonZeroRunsTest, RunsPutBackGiveTheSameBytes) {
    for (std::uint32_t seed = 0; seed < 200; ++seed) {
        RandomUnit random(seed);
        const std::string content = random.bytes(random.below(20000)) + zeros(random.below(5000)) +
                                    random.bytes(random.below(3000));
        std::string again = zeros(content.size());
        std::uint64_t end = 0;
        for (const auto& [offset, run] : kit::sparseContent(content)) {
            ASSERT_TRUE(end == 0 || offset >= end + 16) << seed;
            ASSERT_TRUE(run.front() != '\0' && run.back() != '\0') << seed;
            ASSERT_EQ(run.find(zeros(16)), std::string::npos) << seed;
            again.replace(offset, run.size(), run);
            end = offset + run.size();
        }
        ASSERT_TRUE(again == content) << seed;
    }
}

/// Reading these zeros one by one would take longer than a test may.
TEST_F(NonZeroRunsTest, HolesAreSkipped) {
    constexpr std::uint64_t SIZE = std::uint64_t{1} << 40U;
    const kit::Descriptor made = kit::makeSparseFile(file(), SIZE);
    kit::writeAt(made, file(), SIZE / 2 - 1, "ab");
    kit::writeAt(made, file(), SIZE - 1, "c");
    EXPECT_EQ(runsOfFile(), (kit::SparseContent{{SIZE / 2 - 1, "ab"}, {SIZE - 1, "c"}}));
}

TEST_F(NonZeroRunsTest, OnlyTheRequestedBytesAreRead) {
    writeFile(file(), "abcd");
    EXPECT_EQ(kit::sparseContent(kit::openForReading(file()), file(), 2),
              (kit::SparseContent{{0, "ab"}}));
}

TEST_F(NonZeroRunsTest, UnreadablePathIsNamed) {
    const fs::path folder = file().parent_path();
    try {
        kit::sparseContent(kit::openForReading(folder), folder, 1);
        ADD_FAILURE() << "read";
    } catch (const kit::KitError& error) {
        EXPECT_EQ(error.what(), "cannot read " + folder.string() + ": Is a directory");
    }
}

TEST(WithoutEndZeros, LeavesZerosInside) {
    EXPECT_EQ(kit::withoutTrailingZeros(""), "");
    EXPECT_EQ(kit::withoutTrailingZeros(zeros(9)), "");
    EXPECT_EQ(kit::withoutTrailingZeros("a" + zeros(2) + "b" + zeros(3)), "a" + zeros(2) + "b");
    EXPECT_EQ(kit::withoutTrailingZeros("ab"), "ab");
}

} // namespace

} // namespace orvane::test
