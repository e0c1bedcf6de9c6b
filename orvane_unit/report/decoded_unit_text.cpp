// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/report/decoded_unit_text.h"

#include "config/param_catalogue.h"
#include "config/record_slots.h"
#include "identity/inf_file.h"
#include "kit/description/unit_description.h"
#include "kit/host/sparse_content.h"
#include "kit/host/text.h"
#include "orvane_unit/explain/explanation.h"
#include "orvane_unit/explain/reasons.h"
#include "orvane_unit/explain/value_origins.h"
#include "orvane_unit/explain/version_choice.h"
#include "orvane_unit/report/terminal.h"
#include "tuning/dps_block.h"

#include <array>
#include <cstddef>
#include <cstdint>
#include <iomanip>
#include <map>
#include <optional>
#include <sstream>
#include <vector>

namespace orvane::desk {

namespace {

std::string hexNumber(std::uint32_t number, int digits) {
    std::ostringstream text;
    text << "0x" << std::hex << std::setw(digits) << std::setfill('0') << number;
    return text.str();
}

void printParams(std::ostream& out, const Contents& contents) {
    out << "image: " << kit::counted(contents.image.bytes.size(), "byte");
    if (contents.image.reason != Reason::fromImage) {
        out << ", " << painted(Colour::bad, reasonInfo(contents.image.reason).sentence);
    }
    out << "\nparam group offset size    raw    hex default       mask code\n";
    for (const Param& param : contents.params) {
        out << std::setw(5) << param.row.number << std::setw(6) << param.row.group << std::setw(7)
            << param.row.offset << std::setw(5) << param.size;
        if (param.raw) {
            out << std::setw(7) << *param.raw << std::setw(7)
                << hexNumber(*param.raw, static_cast<int>(param.size) * 2);
        } else {
            out << std::setw(7) << "-" << std::setw(7) << "-";
        }
        out << std::setw(8) << param.row.defaultValue << ' ' << hexNumber(param.row.mask, 8)
            << std::setw(5) << (param.row.id >> 16U);
        if (!param.meaning.empty()) {
            out << "  " << painted(Colour::good, kit::printable(param.meaning));
        }
        out << '\n';
    }
}

void printBytes(std::ostream& out, const std::string& bytes) {
    const std::string text = kit::withoutEndZeros(bytes);
    if (text.empty()) {
        out << painted(Colour::faint, "zeros");
    } else {
        out << '"' << kit::printable(text) << '"';
        if (kit::printable(text) != text) {
            out << "  " << painted(Colour::faint, kit::hexText(text));
        }
    }
}

void printRecords(std::ostream& out, const Contents& contents) {
    out << "disk: " << kit::counted(contents.diskSize, "byte");
    if (contents.diskTrouble) {
        out << ", " << painted(Colour::bad, reasonInfo(*contents.diskTrouble).sentence);
    }
    out << "\nslot offset size  content\n";
    for (const Slot& slot : contents.slots) {
        out << std::setw(4) << slot.number << std::setw(7) << slot.offset << std::setw(5)
            << slot.size << "  ";
        if (slot.number == CRC_RECORD_SLOT) {
            out << "slots 1 to 9 once more";
        } else if (slot.bytes) {
            printBytes(out, *slot.bytes);
        } else {
            out << '-';
        }
        out << '\n';
    }
    out << "auxiliary area: ";
    if (contents.aux) {
        printBytes(out, *contents.aux);
    } else {
        out << '-';
    }
    out << "\nCRC over slots 1 to 9: " << hexNumber(contents.crc, 8) << ", "
        << crcVerdictName(contents.crcVerdict) << '\n';
}

void printTuning(std::ostream& out, const Contents& contents) {
    if (contents.tuning.reason != Reason::fromTuningBlock) {
        out << "tuning blocks: "
            << painted(Colour::bad, reasonInfo(contents.tuning.reason).sentence) << '\n';
        return;
    }
    for (std::int32_t id = 0; id < DPS_BLOCK_COUNT; ++id) {
        const DpsBlock& block = contents.tuning.blocks.at(static_cast<std::size_t>(id));
        out << "tuning block " << id
            << (id == DPS_BLOCK_TELEPHONY   ? ", telephony"
                : id == DPS_BLOCK_SPEECHREC ? ", speech recognition"
                                            : "");
        const std::string bytes(block.bytes.begin(), block.bytes.end());
        if (kit::withoutEndZeros(bytes).empty()) {
            out << ": " << painted(Colour::faint, "zeros") << '\n';
            continue;
        }
        out << '\n';
        for (const DpsField& field : DPS_LAYOUT) {
            out << "  " << std::left << std::setw(24) << field.key << std::right;
            for (std::size_t element = 0; element < field.count; ++element) {
                out << (element == 0 ? "" : ", ") << decodeField(block, field, element);
            }
            if (field.kind == DpsKind::switchWord || field.kind == DpsKind::modeWord) {
                const std::string word = fieldWord(field, decodeField(block, field, 0));
                out << "  "
                    << painted(word.empty() ? Colour::bad : Colour::good,
                               word.empty() ? "no word" : word);
            }
            out << '\n';
        }
    }
}

void printVersions(std::ostream& out, const Contents& contents) {
    const VersionFiles& versions = contents.versions;
    for (std::size_t i = 0; i < versions.files.size(); ++i) {
        const VersionFile& file = versions.files[i];
        out << kit::printable(file.path) << ": ";
        if (versions.chosen == i) {
            out << painted(Colour::good,
                           "chosen: the first application in the order of the listing");
        } else if (file.isApplication) {
            out << "not chosen: an application, but not the first one";
        } else {
            out << "not chosen: its type has no \"Application\" in it";
        }
        out << '\n';
        for (const auto& [key, value] : file.record) {
            out << "  " << kit::printable(key) << " = " << kit::printable(value) << '\n';
        }
    }
    if (!versions.hasFolder) {
        out << painted(Colour::bad, reasonInfo(Reason::versionFolderMissing).sentence) << '\n';
    }
    out << "version: \"" << kit::printable(contents.version) << "\", as digits "
        << contents.versionDigits << '\n';
}

const char* kindName(PathKind kind) {
    switch (kind) {
    case PathKind::nothing:
        return "missing";
    case PathKind::file:
        return "file";
    case PathKind::folder:
        return "folder";
    case PathKind::other:
        return "device";
    }
    return "";
}

void printFiles(std::ostream& out, const Contents& contents) {
    for (const UnitFile& file : contents.files) {
        out << std::left << std::setw(52) << file.path << ' ' << std::setw(26) << file.role
            << std::right << ' ' << kindName(file.kind);
        if (file.kind == PathKind::file) {
            out << ", " << kit::counted(file.size, "byte");
        }
        out << '\n';
    }
}

} // namespace

void printContents(std::ostream& out, const Contents& contents, const std::string& only) {
    using Print = void (*)(std::ostream&, const Contents&);
    constexpr Print PRINTS[] = {printParams, printRecords, printTuning, printVersions, printFiles};
    std::size_t part = 0;
    for (const char* name : CONTENT_PARTS) {
        if (only.empty() || only == name) {
            PRINTS[part](out, contents);
        }
        ++part;
    }
}

} // namespace orvane::desk
