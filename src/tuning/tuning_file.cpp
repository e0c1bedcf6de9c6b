// SPDX-License-Identifier: Apache-2.0
#include "tuning/tuning_file.h"

#include "config/record_area.h"
#include "tuning/dps_block.h"

#include <fstream>
#include <ostream>

namespace orvane {

namespace {

void writeValue(std::ostream& file, const DpsBlock& block, const DpsField& field) {
    switch (field.kind) {
    case DpsKind::switchWord:
        file << qwaWord(qwaSwitchWords, decodeField(block, field, 0));
        break;
    case DpsKind::modeWord:
        file << qwaWord(qwaModeWords, decodeField(block, field, 0));
        break;
    case DpsKind::number:
        file << decodeField(block, field, 0);
        break;
    case DpsKind::list:
        for (std::size_t element = 0; element < field.count; ++element) {
            file << decodeField(block, field, element) << ' '; // the last one, too
        }
        break;
    }
}

} // namespace

void generateTuningFile(std::int32_t blockId, const std::string& path) {
    if (blockId < 0 || blockId >= DPS_BLOCK_COUNT) {
        return;
    }
    // Read before the file is opened, and the result not looked at: what can't be read stays zero.
    DpsArea area{};
    readTuningArea(area.data(), sizeof area);

    std::ofstream file(path);
    if (file.fail()) {
        return;
    }
    const DpsBlock& block = area[static_cast<std::size_t>(blockId)];
    // "Genereated" is spelled so on purpose, and every line is flushed on purpose.
    file << "; Genereated config from DPS (blockId " << blockId << ")" << std::endl;
    for (const DpsField& field : DPS_LAYOUT) {
        file << field.key << ' ';
        writeValue(file, block, field);
        file << std::endl;
    }
}

} // namespace orvane
