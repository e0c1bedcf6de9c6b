// SPDX-License-Identifier: Apache-2.0
#include "tuning/tuning_file.h"

#include "config/record_area.h"
#include "tuning/dps_block.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <cstddef>
#include <fstream>
#include <string_view>

namespace orvane {

namespace {

/// Characters of the longest value, which has 16 bits and a sign.
constexpr std::size_t NUMBER_SIZE = 6;
/// Characters of the longest line: key, blank, every value with a blank behind it, line end.
constexpr std::size_t LINE_SIZE = DPS_KEY_MAX + 1 + DPS_COUNT_MAX * (NUMBER_SIZE + 1) + 1;
using Line = std::array<char, LINE_SIZE>;

// A line is built before it is written: the stream would look up its locale's digits for every
// number. Each function returns the new end of the line.

char* appendText(char* end, std::string_view text) {
    return std::copy(text.begin(), text.end(), end);
}

char* appendNumber(char* end, std::int32_t number) {
    return std::to_chars(end, end + NUMBER_SIZE, number).ptr;
}

char* appendValue(char* end, const DpsBlock& block, const DpsField& field) {
    const std::int32_t first = decodeField(block, field, 0);
    if (field.kind == DpsKind::switchWord) {
        return appendText(end, qwaWord(qwaSwitchWords, first));
    }
    if (field.kind == DpsKind::modeWord) {
        return appendText(end, qwaWord(qwaModeWords, first));
    }
    if (field.kind == DpsKind::number) {
        return appendNumber(end, first);
    }
    for (std::size_t element = 0; element < field.count; ++element) {
        end = appendNumber(end, decodeField(block, field, element));
        *end++ = ' '; // behind the last one, too
    }
    return end;
}

} // namespace

void writeTuningText(std::ostream& file, std::int32_t blockId, const DpsBlock& block) {
    // "Genereated" is spelled so on purpose, and every line is flushed on purpose.
    file << "; Genereated config from DPS (blockId " << blockId << ")" << std::endl;
    Line line{};
    for (const DpsField& field : DPS_LAYOUT) {
        char* end = appendText(line.data(), field.key);
        *end++ = ' ';
        end = appendValue(end, block, field);
        *end++ = '\n';
        file.write(line.data(), end - line.data()).flush();
    }
}

void generateTuningFile(std::int32_t blockId, const std::string& path) {
    if (blockId < 0 || blockId >= DPS_BLOCK_COUNT) {
        return;
    }
    // Read before the file is opened, and the result not looked at: what can't be read stays zero.
    DpsArea area{};
    readTuningArea(area.data(), sizeof area);

    // Longer than any line. Opening the file needs no memory then.
    constexpr std::streamsize BUFFER_SIZE = 512; // bytes
    std::array<char, BUFFER_SIZE> buffer;        // NOLINT(*-member-init): a stream writes it first
    std::ofstream file;
    file.rdbuf()->pubsetbuf(buffer.data(), BUFFER_SIZE);
    file.open(path);
    if (file.fail()) {
        return;
    }
    writeTuningText(file, blockId, area[static_cast<std::size_t>(blockId)]);
}

} // namespace orvane
