// SPDX-License-Identifier: Apache-2.0
#include "config/param_catalogue.h"

namespace orvane {

// clang-format off
constexpr ParamTable ParamCatalogue = {
    {{1, 2, 4, 1, 1, 2, 4, 4, 8}},
    // The rows as issued: number, type, group, offset, id, default, mask.
    {{
        {  1, 0, 0,   0, 0x000400A0,  0, 0xFFFFFFFF},
        {  2, 0, 0,   1, 0x000500A0,  0, 0xFFFFFFFF},
        {  3, 0, 0,   2, 0x000B00A0,  0, 0xFFFFFFFF},
        {  4, 0, 0,   3, 0x000300A0,  0, 0xFFFFFFFF},
        {  5, 0, 0,   4, 0x000C00A0,  0, 0xFFFFFFFF},
        {  6, 0, 0,   5, 0x000D00A0,  0, 0xFFFFFFFF},
        {  7, 0, 0,   6, 0x000E00A0,  0, 0xFFFFFFFF},
        {  8, 0, 0,   7, 0x000F00A0,  0, 0xFFFFFFFF},
        {  9, 0, 0,   8, 0x001000A0,  1, 0xFFFFFFFF},
        { 10, 0, 0,   9, 0x001100A0,  0, 0xFFFFFFFF},
        { 11, 0, 0,  10, 0x001200A0,  0, 0xFFFFFFFF},
        { 12, 0, 0,  11, 0x000100A0,  0, 0xFFFFFFFF},
        { 13, 0, 0,  12, 0x000600A0,  0, 0xFFFFFFFF},
        { 14, 0, 0,  13, 0x001400A0,  0, 0xFFFFFFFF},
        { 15, 0, 0,  14, 0x001300A0,  0, 0xFFFFFFFF},
        { 16, 0, 0,  15, 0x003600A0,  0, 0xFFFFFFFF},
        { 17, 0, 0,  16, 0x001500A0,  0, 0xFFFFFFFF},
        { 18, 0, 0,  17, 0x001600A0,  0, 0xFFFFFFFF},
        { 19, 0, 0,  18, 0x002F00A0,  0, 0xFFFFFFFF},
        { 20, 0, 0,  19, 0x004500A0,  0, 0xFFFFFFFF},
        { 21, 0, 0,  20, 0x003700A0,  0, 0xFFFFFFFF},
        { 22, 0, 0,  21, 0x001900A0,  0, 0xFFFFFFFF}, // drive side
        { 23, 0, 0,  22, 0x001A00A0,  0, 0x7FFFFFFE},
        { 24, 0, 0,  23, 0x001800A0,  0, 0xFFFFFFFF},
        { 25, 0, 0,  24, 0x001C00A0,  0, 0xFFFFFFFF},
        { 26, 0, 0,  25, 0x001D00A0,  0, 0xFFFFFFFF},
        { 27, 0, 0,  26, 0x001E00A0,  0, 0xFFFFFFFF},
        { 28, 0, 0,  27, 0x001F00A0,  0, 0xFFFFFFFF},
        { 29, 0, 0,  28, 0x002000A0,  0, 0xFFFFFFFF},
        { 30, 0, 0,  29, 0x002100A0,  0, 0x7FFFFFFE},
        { 31, 0, 0,  30, 0x002200A0,  0, 0xFFFFFFFF},
        { 32, 0, 0,  31, 0x002300A0,  0, 0xFFFFFFFF},
        { 33, 0, 0,  32, 0x002400A0,  0, 0xFFFFFFFF},
        { 34, 0, 0,  33, 0x002500A0,  0, 0xFFFFFFFF},
        { 35, 0, 0,  34, 0x002600A0,  0, 0xFFFFFFFF},
        { 36, 0, 0,  35, 0x000200A0,  0, 0xFFFFFFFF}, // brand
        { 37, 0, 0,  36, 0x002700A0,  0, 0xFFFFFFFF},
        { 38, 0, 0,  37, 0x002800A0,  0, 0x00000003},
        { 39, 0, 0,  38, 0x000900A0,  0, 0xFFFFFFFF},
        { 40, 0, 0,  39, 0x003500A0,  0, 0xFFFFFFFF},
        { 41, 0, 0,  40, 0x000000A0,  0, 0x7FFFFFFE},
        { 42, 0, 0,  41, 0x002900A0,  0, 0xFFFFFFFF},
        { 43, 0, 0,  42, 0x001700A0,  0, 0xFFFFFFFF},
        { 44, 0, 0,  43, 0x003F00A0,  0, 0xFFFFFFFF},
        { 45, 0, 0,  44, 0x004000A0,  0, 0xFFFFFFFF},
        { 46, 0, 0,  45, 0x004100A0,  0, 0xFFFFFFFF},
        { 47, 0, 0,  46, 0x004200A0,  0, 0xFFFFFFFF},
        { 48, 0, 0,  47, 0x004600A0,  0, 0xFFFFFFFF},
        { 49, 0, 0,  48, 0x004700A0,  0, 0xFFFFFFFF},
        { 50, 0, 0,  49, 0x003800A0,  0, 0xFFFFFFFF}, // fuel type
        { 51, 0, 0,  50, 0x003900A0,  0, 0xFFFFFFFF},
        { 52, 0, 0,  51, 0x003A00A0,  0, 0x7FFFFFFE},
        { 53, 0, 0,  52, 0x001B00A0,  0, 0xFFFFFFFF},
        { 54, 0, 0,  53, 0x004A00A0,  0, 0xFFFFFFFF},
        { 55, 0, 0,  54, 0x004C00A0,  0, 0xFFFFFFFF},
        { 56, 0, 0,  55, 0x004D00A0,  0, 0xFFFFFFFF},
        { 57, 0, 0,  56, 0x004E00A0,  0, 0x7FFFFFFE},
        { 58, 0, 0,  57, 0x004F00A0,  0, 0xFFFFFFFF},
        { 59, 0, 0,  58, 0x005000A0,  0, 0xFFFFFFFF},
        { 60, 0, 0,  59, 0x005100A0,  0, 0xFFFFFFFF},
        { 61, 0, 0,  60, 0x005200A0,  0, 0xFFFFFFFF},
        { 62, 0, 0,  61, 0x005300A0,  0, 0xFFFFFFFF},
        { 63, 0, 0,  62, 0x005400A0,  0, 0xFFFFFFFF},
        { 64, 0, 0,  63, 0x005500A0,  0, 0xFFFFFFFF},
        { 65, 0, 0,  64, 0x005600A0,  0, 0xFFFFFFFF}, // id code 86, as parameter 120, on purpose
        { 66, 0, 0,  65, 0x005700A0,  0, 0xFFFFFFFF},
        { 67, 0, 0,  66, 0x005800A0,  0, 0xFFFFFFFF},
        { 68, 0, 0,  67, 0x005A00A0,  0, 0xFFFFFFFF},
        { 69, 0, 1,  68, 0x002A00A0,  0, 0xFFFFFFFF},
        { 70, 0, 1,  69, 0x002B00A0,  0, 0xFFFFFFFF},
        { 71, 0, 1,  70, 0x002C00A0,  0, 0xFFFFFFFF},
        { 72, 0, 1,  71, 0x003400A0,  0, 0xFFFFFFFF},
        { 73, 0, 1,  72, 0x005B00A0,  0, 0xFFFFFFFF},
        { 74, 0, 1,  73, 0x005C00A0,  0, 0xFFFFFFFF},
        { 75, 0, 1,  74, 0x005D00A0,  0, 0xFFFFFFFF},
        { 76, 0, 1,  75, 0x005E00A0,  0, 0xFFFFFFFF},
        { 77, 0, 1,  76, 0x005F00A0,  0, 0xFFFFFFFF},
        { 78, 0, 1,  77, 0x006000A0,  0, 0xFFFFFFFF},
        { 79, 0, 1,  78, 0x006100A0,  0, 0xFFFFFFFF},
        { 80, 0, 1,  79, 0x006200A0,  0, 0xFFFFFFFF},
        { 81, 0, 1,  80, 0x006300A0,  0, 0xFFFFFFFF},
        { 82, 0, 1,  81, 0x006400A0,  0, 0xFFFFFFFF},
        { 83, 0, 1,  82, 0x006500A0,  0, 0xFFFFFFFF},
        { 84, 0, 1,  83, 0x006600A0,  0, 0xFFFFFFFF},
        { 85, 0, 1,  84, 0x005900A0,  0, 0xFFFFFFFF},
        { 86, 0, 1,  85, 0x006700A0,  0, 0xFFFFFFFF},
        { 87, 0, 1,  86, 0x006800A0,  0, 0xFFFFFFFF},
        { 88, 0, 1,  87, 0x006A00A0,  0, 0x7FFFFFFE},
        { 89, 0, 1,  88, 0x006B00A0,  0, 0xFFFFFFFF},
        { 90, 0, 1,  89, 0x006C00A0,  0, 0xFFFFFFFF},
        { 91, 0, 1,  90, 0x006D00A0,  0, 0xFFFFFFFF},
        { 92, 0, 1,  91, 0x006E00A0,  0, 0xFFFFFFFF},
        { 93, 0, 1,  92, 0x006F00A0,  0, 0xFFFFFFFF},
        { 94, 0, 1,  93, 0x007000A0,  0, 0xFFFFFFFF},
        { 95, 0, 1,  94, 0x007100A0,  0, 0xFFFFFFFF},
        { 96, 0, 1,  95, 0x007300A0,  0, 0xFFFFFFFF},
        { 97, 0, 1,  96, 0x007400A0,  0, 0xFFFFFFFF},
        { 98, 0, 1,  97, 0x007500A0,  0, 0xFFFFFFFF},
        { 99, 0, 1,  98, 0x007600A0,  0, 0xFFFFFFFF},
        {100, 0, 1,  99, 0x007700A0,  0, 0x7FFFFFFE},
        {101, 0, 1, 100, 0x007800A0,  0, 0x7FFFFFFE},
        {102, 0, 1, 101, 0x007900A0,  0, 0x7FFFFFFE},
        {103, 0, 1, 102, 0x007A00A0,  0, 0x7FFFFFFE},
        {104, 0, 1, 103, 0x009700A0,  0, 0x7FFFFFFE},
        {105, 0, 1, 104, 0x009800A0,  0, 0x7FFFFFFE},
        {106, 0, 1, 105, 0x009900A0,  0, 0x7FFFFFFE},
        {107, 0, 1, 106, 0x009A00A0,  0, 0x7FFFFFFE},
        {108, 0, 1, 107, 0x009B00A0,  0, 0x7FFFFFF0},
        {109, 0, 1, 108, 0x009C00A0,  0, 0x7FFFFFF0},
        {110, 0, 1, 109, 0x009D00A0,  0, 0x7FFFFFF0},
        {111, 0, 1, 110, 0x009E00A0,  0, 0x7FFFFFFC},
        {112, 0, 1, 111, 0x00A000A0,  0, 0x7FFFFFEC},
        {113, 0, 1, 112, 0x00A400A0,  0, 0x7FFFFFF0},
        {114, 0, 1, 113, 0x00A500A0,  0, 0x7FFFFFF0},
        {115, 0, 1, 114, 0x00A600A0,  0, 0x7FFFFFF0},
        {116, 0, 1, 115, 0x00A700A0,  0, 0x7FFFFFE0},
        {117, 0, 1, 116, 0x00A800A0,  0, 0x7FFFFFE0},
        {118, 0, 1, 117, 0x00B400A0,  0, 0x7FFFFFE0},
        {119, 0, 1, 118, 0x00A100A0,  0, 0x00000004},
        {120, 0, 1, 119, 0x005600A0,  0, 0x7FFFFFC0}, // id code 86, as parameter 65, on purpose
        {121, 0, 1, 120, 0x00B600A0,  0, 0x7FFFFFC0},
        {122, 0, 1, 121, 0x00B700A0,  0, 0x7FFFFF80},
        {123, 0, 1, 122, 0x00CD00A0,  0, 0x7FFFFF80},
        {124, 0, 1, 123, 0x00BA00A0,  0, 0x7FFFFF80},
        {125, 0, 1, 124, 0x00BB00A0,  0, 0x7FFFFF80},
        {126, 0, 1, 125, 0x009500A0,  5, 0x7FFFFFFE},
        {127, 0, 2, 126, 0x003C00A0,  0, 0xFFFFFFFF},
        {128, 0, 2, 127, 0x003B00A0,  0, 0xFFFFFFFF},
        {129, 0, 2, 128, 0x003D00A0,  0, 0xFFFFFFFF},
        {130, 0, 2, 129, 0x004B00A0,  0, 0xFFFFFFFF},
        {131, 0, 2, 130, 0x004900A0,  0, 0x0000001F},
        {132, 0, 2, 131, 0x00CE00A0,  0, 0x7FFFFF80},
        {133, 0, 3, 132, 0x002D00A0,  1, 0xFFFFFFFF},
        {134, 1, 3, 133, 0x002E00A0,  0, 0xFFFFFFFF}, // audio profile
        {135, 0, 3, 135, 0x00AC00A0,  0, 0x7FFFFFF0},
        {136, 0, 3, 136, 0x00AD00A0,  0, 0x7FFFFFF0},
        {137, 0, 3, 137, 0x00AE00A0,  0, 0x7FFFFFF0},
        {138, 0, 3, 138, 0x003000A0,  0, 0xFFFFFFFF},
        {139, 0, 3, 139, 0x003100A0,  0, 0x7FFFFFFE}, // model
        {140, 0, 3, 140, 0x003200A0,  0, 0xFFFFFFFF},
        {141, 0, 3, 141, 0x003300A0,  0, 0xFFFFFFFF},
        {142, 1, 4, 142, 0x003E00A0,  0, 0xFFFFFFFF},
        {143, 1, 4, 144, 0x006900A0,  0, 0xFFFFFFFF},
        {144, 1, 4, 146, 0x009400A0,  0, 0xFFFFFFFF},
        {145, 0, 5, 148, 0x007C00A0,  0, 0xFFFFFFFF},
        {146, 0, 5, 149, 0x00A200A0,  0, 0x7FFFFFF8},
        {147, 0, 6, 150, 0x008800A0, 10, 0xFFFFFFFF},
        {148, 0, 6, 151, 0x008900A0,  0, 0xFFFFFFFF},
        {149, 0, 6, 152, 0x008A00A0,  0, 0xFFFFFFFF},
        {150, 0, 6, 153, 0x008B00A0,  0, 0xFFFFFFFF},
        {151, 0, 6, 154, 0x008C00A0,  0, 0xFFFFFFFF},
        {152, 1, 6, 155, 0x008D00A0,  0, 0xFFFFFFFF},
        {153, 1, 6, 157, 0x008E00A0,  0, 0xFFFFFFFF},
        {154, 1, 6, 159, 0x008F00A0,  0, 0xFFFFFFFF},
        {155, 0, 6, 161, 0x009000A0,  0, 0xFFFFFFFF},
        {156, 0, 6, 162, 0x009100A0,  0, 0xFFFFFFFF},
        {157, 0, 6, 163, 0x009200A0,  0, 0xFFFFFFFF},
        {158, 1, 6, 164, 0x009300A0,  0, 0xFFFFFFFF},
        {159, 0, 7, 166, 0x00BD00A0,  0, 0x7FFFFFC0},
        {160, 0, 7, 167, 0x00BE00A0,  0, 0x7FFFFFC0},
        {161, 0, 7, 168, 0x00BF00A0,  0, 0x7FFFFFC0},
        {162, 0, 7, 169, 0x00C000A0,  0, 0x7FFFFFC0},
        {163, 0, 7, 170, 0x00C100A0,  0, 0x7FFFFFC0},
        {164, 0, 7, 171, 0x00C200A0,  0, 0x7FFFFFC0},
        {165, 0, 7, 172, 0x00C300A0,  0, 0x7FFFFFC0},
        {166, 0, 7, 173, 0x00C400A0,  0, 0x7FFFFFC0},
        {167, 0, 7, 174, 0x00C500A0,  0, 0x7FFFFFC0},
        {168, 0, 7, 175, 0x00C600A0,  0, 0x7FFFFFC0},
        {169, 0, 7, 176, 0x00C700A0,  0, 0x7FFFFFC0},
        {170, 0, 7, 177, 0x00C800A0,  0, 0x7FFFFF80},
        {171, 0, 7, 178, 0x00C900A0,  0, 0x7FFFFF80},
    }},
};
// clang-format on

static_assert(sizeof(ParamDescriptor) == 7 * sizeof(std::uint32_t), "a row is seven words");
static_assert(sizeof(ParamTable) == 4824, "the table has no padding");

std::uint32_t paramTypeSize(ParamType type) {
    return type < ParamCatalogue.typeSizes.size() ? ParamCatalogue.typeSizes[type] : 1;
}

std::uint32_t lookupParam(std::uint16_t number, std::int32_t& index, ParamDescriptor& descriptor) {
    // In 16 bits, so that number 0 wraps to 65535 and fails with the numbers past the end.
    const auto position = static_cast<std::uint16_t>(number - 1);
    if (position >= PARAM_COUNT) {
        index = -1;
        return 1;
    }
    index = position;
    descriptor = ParamCatalogue.rows[position];
    return 0;
}

std::uint32_t paramGroup(std::uint16_t number) {
    std::int32_t index = 0;
    ParamDescriptor descriptor{};
    return lookupParam(number, index, descriptor) == 0 ? descriptor.group : NO_GROUP;
}

std::uint32_t describeParam(std::uint16_t number, ParamInfo& info) {
    std::int32_t index = 0;
    ParamDescriptor descriptor{};
    const std::uint32_t result = lookupParam(number, index, descriptor);
    if (result == 0) {
        info.number = number;
        info.type = static_cast<std::uint16_t>(descriptor.type);
        info.size = static_cast<std::uint16_t>(paramTypeSize(descriptor.type));
        info.group = static_cast<std::uint16_t>(descriptor.group);
    }
    return result;
}

} // namespace orvane
