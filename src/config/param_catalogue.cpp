// SPDX-License-Identifier: Apache-2.0
#include "config/param_catalogue.h"

#include "config/param_rows.h"

namespace orvane {

constexpr ParamTable ParamCatalogue = {{1, 2, 4, 1, 1, 2, 4, 4, 8}, PARAM_ROWS};

namespace {

constexpr std::uint32_t sizeOf(ParamType type) {
    return type < ParamCatalogue.typeSizes.size() ? ParamCatalogue.typeSizes[type] : 1;
}

/// Rows are numbered from 1 without a gap, lie back to back in the image from byte 0, and fill it.
constexpr bool rowsPackTheImage() {
    std::uint32_t number = 1;
    std::uint32_t offset = 0;
    for (const ParamDescriptor& row : ParamCatalogue.rows) {
        if (row.number != number || row.offset != offset) {
            return false;
        }
        ++number;
        offset += sizeOf(row.type);
    }
    return offset == CONFIG_IMAGE_SIZE;
}

constexpr bool idsEndIn00A0() {
    for (const ParamDescriptor& row : ParamCatalogue.rows) {
        if ((row.id & 0xFFFFU) != 0x00A0U) {
            return false;
        }
    }
    return true;
}

constexpr bool groupsAscend() {
    std::uint32_t group = 0;
    for (const ParamDescriptor& row : ParamCatalogue.rows) {
        if (row.group != group && row.group != group + 1) {
            return false;
        }
        group = row.group;
    }
    return group == NO_GROUP - 1;
}

constexpr std::size_t countFullMasks() {
    std::size_t count = 0;
    for (const ParamDescriptor& row : ParamCatalogue.rows) {
        count += row.mask == 0xFFFFFFFFU ? 1 : 0;
    }
    return count;
}

constexpr std::size_t countDefaults() {
    std::size_t count = 0;
    for (const ParamDescriptor& row : ParamCatalogue.rows) {
        count += row.defaultValue != 0 ? 1 : 0;
    }
    return count;
}

static_assert(rowsPackTheImage());
static_assert(groupsAscend());
static_assert(idsEndIn00A0());
static_assert(countDefaults() == 4 && countFullMasks() == 117);
static_assert(sizeof(ParamDescriptor) == 7 * sizeof(std::uint32_t));
static_assert(sizeof(ParamTable) == 4824, "nothing between the sizes and the rows, nor after");

} // namespace

std::uint32_t paramTypeSize(ParamType type) {
    return sizeOf(type);
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
