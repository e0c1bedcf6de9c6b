// SPDX-License-Identifier: Apache-2.0
#include "tuning/tuning_file.h"

#include "config/record_area.h"
#include "tuning/dps_block.h"

#include <array>
#include <fstream>
#include <ostream>

namespace orvane {

namespace {

void writeValue(std::ostream& file, const DpsBlock& block, const DpsField& field) {
    const std::int32_t first = decodeField(block, field, 0);
    if (field.kind == DpsKind::switchWord) {
        file << qwaWord(qwaSwitchWords, first);
    } else if (field.kind == DpsKind::modeWord) {
        file << qwaWord(qwaModeWords, first);
    } else if (field.kind == DpsKind::number) {
        file << first;
    } else {
        for (std::size_t element = 0; element < field.count; ++element) {
            file << decodeField(block, field, element) << ' '; // behind the last one, too
        }
    }
}

} // namespace

void writeTuningText(std::ostream& file, std::int32_t blockId, const DpsBlock& block) {
    // "Genereated" is spelled so on purpose, and every line is flushed on purpose.
    file << "; Genereated config from DPS (blockId " << blockId << ")" << std::endl;
    for (const DpsField& field : DPS_LAYOUT) {
        file << field.key << ' ';
        writeValue(file, block, field);
        file << std::endl;
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
    std::array<char, BUFFER_SIZE> buffer;
    std::ofstream file;
    file.rdbuf()->pubsetbuf(buffer.data(), BUFFER_SIZE);
    file.open(path);
    if (file.fail()) {
        return;
    }
    writeTuningText(file, blockId, area[static_cast<std::size_t>(blockId)]);
}

} // namespace orvane
