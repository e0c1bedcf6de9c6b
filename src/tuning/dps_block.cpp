// SPDX-License-Identifier: Apache-2.0
#include "tuning/dps_block.h"

namespace orvane {

// clang-format off
constexpr std::array<DpsField, DPS_FIELD_COUNT> DPS_LAYOUT = {{
    // key, offset, bit, encoding, kind, count
    {"qwaAECSwitch",            0, 0, DpsEncoding::code2, DpsKind::switchWord, 1},
    {"qwaAGCSwitch",            0, 2, DpsEncoding::code2, DpsKind::switchWord, 1},
    {"qwaDiagSwitch",           0, 4, DpsEncoding::code2, DpsKind::switchWord, 1},
    {"qwaHFESwitch",            0, 6, DpsEncoding::code2, DpsKind::switchWord, 1},
    {"qwaMixFiltSwitch",        1, 0, DpsEncoding::code2, DpsKind::switchWord, 1},
    {"qwaMixSwitch",            1, 2, DpsEncoding::code2, DpsKind::switchWord, 1},
    {"qwaNRSwitch",             1, 4, DpsEncoding::code2, DpsKind::switchWord, 1}, // bits 6-7 unread
    {"qwaRECSwitch",            2, 0, DpsEncoding::code2, DpsKind::switchWord, 1},
    {"qwaRecvAGCSwitch",        2, 2, DpsEncoding::code2, DpsKind::switchWord, 1},
    {"qwaRecvBWESwitch",        2, 4, DpsEncoding::code2, DpsKind::switchWord, 1},
    {"qwaRecvDLCSwitch",        2, 6, DpsEncoding::code2, DpsKind::switchWord, 1},
    {"qwaRecvDTFSwitch",        3, 0, DpsEncoding::code2, DpsKind::switchWord, 1},
    {"qwaRecvENSSwitch",        3, 2, DpsEncoding::code2, DpsKind::switchWord, 1},
    {"qwaRecvEQSwitch",         3, 4, DpsEncoding::code2, DpsKind::switchWord, 1}, // bits 6-7 unread
    {"qwaSendDynEQSwitch",      4, 0, DpsEncoding::code2, DpsKind::switchWord, 1},
    {"qwaSendEQSwitch",         4, 2, DpsEncoding::code2, DpsKind::switchWord, 1}, // bits 4-5 unread
    {"qwaWNDBMode",             4, 6, DpsEncoding::code2, DpsKind::modeWord,   1},
    {"qwaWNDBSwitch",           5, 0, DpsEncoding::u8,    DpsKind::switchWord, 1}, // the whole byte is the code
    {"qwaAECFiltLen",           6, 0, DpsEncoding::i16,   DpsKind::number,     1},
    {"qwaLFRSwitch",            8, 0, DpsEncoding::i16,   DpsKind::switchWord, 1}, // a signed 16-bit code
    {"qwaHFEExtent",           10, 0, DpsEncoding::u8,    DpsKind::number,     1}, // one unsigned byte among the 16-bit numbers; bytes 11-12 unread
    {"qwaNCParams",            13, 0, DpsEncoding::i16,   DpsKind::list,       5},
    {"qwaNRAtten",             23, 0, DpsEncoding::i16,   DpsKind::number,     1},
    {"qwaRECSuppress",         25, 0, DpsEncoding::u8,    DpsKind::number,     1}, // one unsigned byte, too
    {"qwaRecvAGCAmpTgts",      26, 0, DpsEncoding::i16,   DpsKind::list,       2}, // receive: AmpTgts, GainVals, MaxRates
    {"qwaRecvAGCGainVals",     30, 0, DpsEncoding::i16,   DpsKind::list,       3},
    {"qwaRecvAGCMaxRates",     36, 0, DpsEncoding::i16,   DpsKind::list,       2},
    {"qwaRecvGain",            40, 0, DpsEncoding::i16,   DpsKind::number,     1},
    {"qwaRecvLimitThresh",     42, 0, DpsEncoding::i16,   DpsKind::number,     1},
    {"qwaRecvParamEQNodes",    44, 0, DpsEncoding::i16,   DpsKind::list,      15}, // bytes 74-75 unread
    {"qwaRefDelay",            76, 0, DpsEncoding::i16,   DpsKind::number,     1},
    {"qwaRefMaxDelay",         78, 0, DpsEncoding::i16,   DpsKind::number,     1}, // bytes 80-83 unread
    {"qwaSendAGCMaxRates",     84, 0, DpsEncoding::i16,   DpsKind::list,       2}, // send: MaxRates, AmpTgts, GainVals
    {"qwaSendAGCAmpTgts",      88, 0, DpsEncoding::i16,   DpsKind::list,       2},
    {"qwaSendAGCGainVals",     92, 0, DpsEncoding::i16,   DpsKind::list,       3},
    {"qwaSendDynEQMinMaxSNR",  98, 0, DpsEncoding::i16,   DpsKind::list,       2},
    {"qwaSendGain",           102, 0, DpsEncoding::i16,   DpsKind::number,     1},
    {"qwaSendLimitThresh",    104, 0, DpsEncoding::i16,   DpsKind::number,     1},
    {"qwaSendParamEQ2Nodes",  106, 0, DpsEncoding::i16,   DpsKind::list,      15}, // the second equaliser comes first
    {"qwaSendParamEQNodes",   136, 0, DpsEncoding::i16,   DpsKind::list,      15},
    {"qwaWNDBSuppress",       166, 0, DpsEncoding::u8,    DpsKind::number,     1}, // one unsigned byte, too
    {"qwaDNSEnable",          167, 0, DpsEncoding::i16,   DpsKind::number,     1}, // a number, despite its name
    {"qwaIVOSwitch",          169, 0, DpsEncoding::i16,   DpsKind::switchWord, 1}, // a signed 16-bit code
    {"qwaMEQEnable",          171, 0, DpsEncoding::i16,   DpsKind::list,       4}, // a list, despite its name; bytes 179-187 unread
}};
// clang-format on

constexpr std::array<QwaWord, 3> qwaSwitchWords = {{
    {1, "qwaOff"},
    {2, "qwaOn"},
    {3, "qwaIdle"},
}};

constexpr std::array<QwaWord, 3> qwaModeWords = {{
    {1, "qwaSingleChannel"},
    {2, "qwaMultiChannel"},
    {3, "qwaCombined"},
}};

namespace {

/// Two's complement, low byte first, whatever the processor's own order.
std::int32_t decodeI16(const std::uint8_t* bytes) {
    return static_cast<std::int16_t>(bytes[0] | bytes[1] << 8);
}

} // namespace

std::int32_t decodeField(const DpsBlock& block, const DpsField& field, std::size_t element) {
    const std::uint8_t* const bytes =
        block.bytes.data() + field.offset + element * dpsElementSize(field.encoding);
    if (field.encoding == DpsEncoding::code2) {
        return *bytes >> field.bit & 3;
    }
    return field.encoding == DpsEncoding::u8 ? *bytes : decodeI16(bytes);
}

const char* qwaWord(const std::array<QwaWord, 3>& words, std::int32_t code) {
    for (const QwaWord& entry : words) {
        if (entry.code == code) {
            return entry.word;
        }
    }
    return "";
}

const std::array<QwaWord, 3>& fieldWords(const DpsField& field) {
    return field.kind == DpsKind::modeWord ? qwaModeWords : qwaSwitchWords;
}

const char* fieldWord(const DpsField& field, std::int32_t code) {
    return qwaWord(fieldWords(field), code);
}

} // namespace orvane
