// SPDX-License-Identifier: Apache-2.0
//
// For tests of the disk's tuning blocks and of the tuning files made from them.
#pragma once

#include "tests/support/unit_test.h"
#include "tuning/tuning_file.h"

#include <string>
#include <vector>

namespace orvane::test {

/// Bytes from the start of the tuning area to the end of the disk.
constexpr std::uint64_t TUNING_AREA_BEFORE_END = 0xFF000;
/// Bytes of one block.
constexpr std::size_t BLOCK_SIZE = 188;
/// The output file of tests to which its name does not matter.
constexpr char ANY_TUNING_FILE[] = "/tmp/tuning.txt";

inline std::vector<std::string> splitLines(const std::string& text) {
    std::vector<std::string> lines;
    std::size_t begin = 0;
    for (std::size_t end = text.find('\n'); end != std::string::npos;
         end = text.find('\n', begin)) {
        lines.push_back(text.substr(begin, end - begin));
        begin = end + 1;
    }
    EXPECT_EQ(begin, text.size()) << "the last line has no end";
    return lines;
}

/// The line of `key` in a tuning file, without its end.
inline std::string lineOf(const std::string& text, const std::string& key) {
    for (const std::string& line : splitLines(text)) {
        if (line.compare(0, key.size() + 1, key + " ") == 0) {
            return line;
        }
    }
    ADD_FAILURE() << "no line " << key;
    return {};
}

class TuningTest : public UnitTest {
protected:
    /// Sets bytes of a block on the disk, from `offset` on.
    static void setBlock(unsigned blockId, std::size_t offset, const std::string& bytes) {
        setDiskFromEnd(TUNING_AREA_BEFORE_END - blockId * BLOCK_SIZE - offset, bytes);
    }
    /// The tuning file of a block on the disk.
    static std::string rendered(std::int32_t blockId) {
        generateTuningFile(blockId, ANY_TUNING_FILE);
        return readFile(ANY_TUNING_FILE);
    }
    /// The tuning file of a block with these bytes and zeros elsewhere.
    static std::string renderedWith(std::size_t offset, const std::string& bytes) {
        setBlock(4, 0, std::string(BLOCK_SIZE, '\0'));
        setBlock(4, offset, bytes);
        return rendered(4);
    }
};

} // namespace orvane::test
