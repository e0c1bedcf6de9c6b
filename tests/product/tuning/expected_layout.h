// SPDX-License-Identifier: Apache-2.0
//
// A second, independent form of the layout of a tuning block, to compare with the product's table.
#pragma once

#include "tuning/dps_block.h"

namespace orvane::test {

constexpr DpsField codeSwitch(const char* key, std::uint8_t offset, std::uint8_t bit) {
    return {key, offset, bit, DpsEncoding::code2, DpsKind::switchWord, 1};
}
constexpr DpsField byteNumber(const char* key, std::uint8_t offset) {
    return {key, offset, 0, DpsEncoding::u8, DpsKind::number, 1};
}
constexpr DpsField number(const char* key, std::uint8_t offset) {
    return {key, offset, 0, DpsEncoding::i16, DpsKind::number, 1};
}
constexpr DpsField list(const char* key, std::uint8_t offset, std::uint8_t count) {
    return {key, offset, 0, DpsEncoding::i16, DpsKind::list, count};
}

constexpr DpsField EXPECTED_LAYOUT[] = {
    codeSwitch("qwaAECSwitch", 0, 0),
    codeSwitch("qwaAGCSwitch", 0, 2),
    codeSwitch("qwaDiagSwitch", 0, 4),
    codeSwitch("qwaHFESwitch", 0, 6),
    codeSwitch("qwaMixFiltSwitch", 1, 0),
    codeSwitch("qwaMixSwitch", 1, 2),
    codeSwitch("qwaNRSwitch", 1, 4),
    codeSwitch("qwaRECSwitch", 2, 0),
    codeSwitch("qwaRecvAGCSwitch", 2, 2),
    codeSwitch("qwaRecvBWESwitch", 2, 4),
    codeSwitch("qwaRecvDLCSwitch", 2, 6),
    codeSwitch("qwaRecvDTFSwitch", 3, 0),
    codeSwitch("qwaRecvENSSwitch", 3, 2),
    codeSwitch("qwaRecvEQSwitch", 3, 4),
    codeSwitch("qwaSendDynEQSwitch", 4, 0),
    codeSwitch("qwaSendEQSwitch", 4, 2),
    {"qwaWNDBMode", 4, 6, DpsEncoding::code2, DpsKind::modeWord, 1},
    {"qwaWNDBSwitch", 5, 0, DpsEncoding::u8, DpsKind::switchWord, 1},
    number("qwaAECFiltLen", 6),
    {"qwaLFRSwitch", 8, 0, DpsEncoding::i16, DpsKind::switchWord, 1},
    byteNumber("qwaHFEExtent", 10),
    list("qwaNCParams", 13, 5),
    number("qwaNRAtten", 23),
    byteNumber("qwaRECSuppress", 25),
    list("qwaRecvAGCAmpTgts", 26, 2),
    list("qwaRecvAGCGainVals", 30, 3),
    list("qwaRecvAGCMaxRates", 36, 2),
    number("qwaRecvGain", 40),
    number("qwaRecvLimitThresh", 42),
    list("qwaRecvParamEQNodes", 44, 15),
    number("qwaRefDelay", 76),
    number("qwaRefMaxDelay", 78),
    list("qwaSendAGCMaxRates", 84, 2),
    list("qwaSendAGCAmpTgts", 88, 2),
    list("qwaSendAGCGainVals", 92, 3),
    list("qwaSendDynEQMinMaxSNR", 98, 2),
    number("qwaSendGain", 102),
    number("qwaSendLimitThresh", 104),
    list("qwaSendParamEQ2Nodes", 106, 15),
    list("qwaSendParamEQNodes", 136, 15),
    byteNumber("qwaWNDBSuppress", 166),
    number("qwaDNSEnable", 167),
    {"qwaIVOSwitch", 169, 0, DpsEncoding::i16, DpsKind::switchWord, 1},
    list("qwaMEQEnable", 171, 4),
};

constexpr std::size_t EXPECTED_FIELD_COUNT = sizeof(EXPECTED_LAYOUT) / sizeof(EXPECTED_LAYOUT[0]);

/// Bits of the block that belong to no field: a mask for each byte.
struct UnreadBits {
    std::size_t first;
    std::size_t last;
    unsigned mask;
};
constexpr UnreadBits UNREAD_BITS[] = {
    {1, 1, 0xC0},   {3, 3, 0xC0},   {4, 4, 0x30},     {11, 12, 0xFF},
    {74, 75, 0xFF}, {80, 83, 0xFF}, {179, 187, 0xFF},
};

} // namespace orvane::test
