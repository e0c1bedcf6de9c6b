// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/report/decoded_unit_text.h"

#include "config/param_catalogue.h"
#include "config/record_slots.h"
#include "identity/inf_file.h"
#include "kit/host/bytes.h"
#include "kit/host/sparse_content.h"
#include "kit/host/text.h"
#include "orvane_unit/explain/explanation.h"
#include "orvane_unit/explain/reasons.h"
#include "orvane_unit/explain/value_origins.h"
#include "orvane_unit/explain/version_choice.h"
#include "orvane_unit/report/names.h"
#include "orvane_unit/report/phrases.h"
#include "orvane_unit/report/table.h"
#include "orvane_unit/report/terminal.h"
#include "tuning/dps_block.h"

#include <array>
#include <cstddef>
#include <cstdint>
#include <map>
#include <optional>
#include <ostream>
#include <utility>
#include <vector>

namespace orvane::desk {

namespace {

constexpr Column PARAM_COLUMNS[] = {{"param", 5},   {"group", 6}, {"offset", 7},
                                    {"size", 5},    {"raw", 7},   {"hex", 7},
                                    {"default", 8}, {"mask", 11}, {"code", 5}};

void printPart(std::ostream& out, const DecodedImage& image) {
    out << "image: " << kit::counted(image.found.size, "byte");
    if (image.found.reason != Reason::fromImage) {
        out << ", " << painted(Colour::bad, reasonInfo(image.found.reason).sentence);
    }
    out << '\n';
    printTitles(out, PARAM_COLUMNS);
    out << '\n';
    for (const DecodedParam& param : image.params) {
        const auto digits = static_cast<unsigned>(param.size) * 2;
        printCells(out, PARAM_COLUMNS, param.row.number, param.row.group, param.row.offset,
                   param.size, param.raw ? std::to_string(*param.raw) : "-",
                   param.raw ? hexNumber(*param.raw, digits) : "-", param.row.defaultValue,
                   hexNumber(param.row.mask, 8), param.code);
        if (!param.meaning.empty()) {
            out << "  " << painted(Colour::good, kit::printable(param.meaning));
        }
        out << '\n';
    }
}

/// Bytes as text, without the zeros at their end; "-" where they can't be read.
std::string contentText(const std::optional<std::string>& bytes) {
    if (!bytes) {
        return "-";
    }
    const std::string text = kit::withoutTrailingZeros(*bytes);
    if (text.empty()) {
        return painted(Colour::faint, "zeros");
    }
    const std::string quoted = '"' + kit::printable(text) + '"';
    return kit::printable(text) == text
               ? quoted
               : quoted + "  " + painted(Colour::faint, kit::hexText(text));
}

constexpr Column SLOT_COLUMNS[] = {{"slot", 4}, {"offset", 7}, {"size", 5}};

void printPart(std::ostream& out, const DecodedRecords& records) {
    out << "disk: " << kit::counted(records.diskSize, "byte");
    if (records.diskTrouble) {
        out << ", " << painted(Colour::bad, reasonInfo(*records.diskTrouble).sentence);
    }
    out << '\n';
    printTitles(out, SLOT_COLUMNS);
    out << "  content\n";
    for (const DecodedSlot& slot : records.slots) {
        printCells(out, SLOT_COLUMNS, slot.number, slot.offset, slot.size);
        const std::string repeated = repeatedSlots(slot.number);
        out << "  " << (repeated.empty() ? contentText(slot.bytes) : "repeats " + repeated) << '\n';
    }
    out << "auxiliary area: " << contentText(records.aux) << '\n'
        << "CRC over " << repeatedSlots(CRC_RECORD_SLOT) << ": " << hexNumber(records.crc, 8)
        << ", " << nameOf(records.crcVerdict) << '\n';
}

constexpr std::size_t FIELD_NAME_WIDTH = 24;

void printField(std::ostream& out, const DpsBlock& block, const DpsField& field) {
    out << "  " << padded(field.key, FIELD_NAME_WIDTH);
    for (std::size_t element = 0; element < field.count; ++element) {
        out << (element == 0 ? "" : ", ") << decodeField(block, field, element);
    }
    if (field.kind == DpsKind::switchWord || field.kind == DpsKind::modeWord) {
        const std::string word = fieldWord(field, decodeField(block, field, 0));
        out << "  "
            << (word.empty() ? painted(Colour::bad, "no word") : painted(Colour::good, word));
    }
    out << '\n';
}

void printPart(std::ostream& out, const TuningArea& tuning) {
    if (tuning.reason != Reason::fromTuningBlock) {
        out << "tuning blocks: " << painted(Colour::bad, reasonInfo(tuning.reason).sentence)
            << '\n';
        return;
    }
    for (std::int32_t id = 0; id < DPS_BLOCK_COUNT; ++id) {
        const DpsBlock& block = tuning.blocks.at(static_cast<std::size_t>(id));
        const std::string purpose = purposeOf(id);
        out << "tuning block " << id << (purpose.empty() ? "" : ", ") << purpose;
        const std::string bytes(block.bytes.begin(), block.bytes.end());
        if (kit::withoutTrailingZeros(bytes).empty()) {
            out << ": " << painted(Colour::faint, "zeros") << '\n';
            continue;
        }
        out << '\n';
        for (const DpsField& field : DPS_LAYOUT) {
            printField(out, block, field);
        }
    }
}

void printPart(std::ostream& out, const DecodedVersions& versions) {
    for (std::size_t i = 0; i < versions.found.files.size(); ++i) {
        const VersionFile& file = versions.found.files[i];
        out << kit::printable(file.path) << ": ";
        const std::string choice = choiceText(versions.found, i);
        out << (versions.found.chosen == i ? painted(Colour::good, choice) : choice) << '\n';
        for (const auto& [key, value] : file.record) {
            out << "  " << kit::printable(key) << " = " << kit::printable(value) << '\n';
        }
    }
    if (!versions.found.hasFolder) {
        out << painted(Colour::bad, reasonInfo(Reason::versionFolderMissing).sentence) << '\n';
    }
    out << "version: \"" << kit::printable(versions.version) << "\", as digits " << versions.digits
        << '\n';
}

constexpr std::size_t PATH_WIDTH = 52;
constexpr std::size_t ROLE_WIDTH = 26;

void printPart(std::ostream& out, const std::vector<UnitFile>& files) {
    for (const UnitFile& file : files) {
        out << padded(file.path, PATH_WIDTH) << ' ' << padded(file.role, ROLE_WIDTH) << ' '
            << wordOf(file.kind);
        if (file.kind == PathKind::file) {
            out << ", " << kit::counted(file.size, "byte");
        }
        out << '\n';
    }
}

} // namespace

void printDecodedUnit(std::ostream& out, const DecodedUnit& unit, const std::string& only) {
    forEachPart(unit, [&out, &only](const char* name, const auto& part) {
        if (only.empty() || only == name) {
            printPart(out, part);
        }
    });
}

} // namespace orvane::desk
