// SPDX-License-Identifier: Apache-2.0
#include "tuning/tuning_file.h"

#include "config/record_area.h"
#include "tuning/dps_block.h"

#include <algorithm>
#include <array>
#include <cstring>
#include <fstream>

namespace orvane {

namespace {

/// A line is built before it is written: the stream would look up its locale's digits for every
/// number. No line is longer than the array; a test computes the longest from the layout.
struct Line {
    std::array<char, DPS_LINE_MAX> text;
    std::size_t length;
};

void append(Line& line, const char* text) {
    const std::size_t length = std::strlen(text);
    std::memcpy(line.text.data() + line.length, text, length);
    line.length += length;
}

void append(Line& line, char character) {
    line.text[line.length++] = character;
}

/// A field's value, -32768 to 32767, in decimal.
void append(Line& line, std::int32_t value) {
    if (value < 0) {
        append(line, '-');
        value = -value;
    }
    const std::size_t first = line.length;
    do {
        append(line, static_cast<char>('0' + value % 10)); // the lowest digit first
        value /= 10;
    } while (value != 0);
    std::reverse(line.text.data() + first, line.text.data() + line.length);
}

void appendValue(Line& line, const DpsBlock& block, const DpsField& field) {
    if (field.kind == DpsKind::list) {
        for (std::size_t element = 0; element < field.count; ++element) {
            append(line, decodeField(block, field, element));
            append(line, ' '); // after the last one, too
        }
        return;
    }
    const std::int32_t value = decodeField(block, field, 0);
    if (field.kind == DpsKind::number) {
        append(line, value);
    } else {
        append(line, fieldWord(field, value));
    }
}

} // namespace

bool isTuningBlock(std::int32_t blockId) {
    return blockId >= 0 && blockId < DPS_BLOCK_COUNT;
}

DpsArea readTuningBlocks() {
    DpsArea area{};
    // The result is ignored, on purpose: what can't be read stays zero.
    readTuningArea(area.data(), sizeof area);
    return area;
}

void writeTuningLine(std::ostream& file, const DpsField& field, const DpsBlock& block) {
    Line line; // NOLINT(*-member-init): written before it is read
    line.length = 0;
    append(line, field.key);
    append(line, ' ');
    appendValue(line, block, field);
    append(line, '\n');
    file.write(line.text.data(), static_cast<std::streamsize>(line.length)).flush();
}

void writeTuningText(std::ostream& file, std::int32_t blockId, const DpsBlock& block) {
    // "Genereated", and the flush of every line, are on purpose.
    file << "; Genereated config from DPS (blockId " << blockId << ")" << std::endl;
    for (const DpsField& field : DPS_LAYOUT) {
        writeTuningLine(file, field, block);
    }
}

void generateTuningFile(std::int32_t blockId, const std::string& path) {
    if (!isTuningBlock(blockId)) {
        return;
    }
    const DpsArea area = readTuningBlocks(); // before the file is opened

    // Longer than any line. A library that takes it needs no memory to open the file.
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
