// SPDX-License-Identifier: Apache-2.0
//
// The vehicle configuration image is a packed array of bytes that does not describe itself. This
// catalogue is the description: parameter number -> type, group and byte offset.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>

namespace orvane {

/// A data-type code. Getters tell types apart by size alone.
using ParamType = std::uint32_t;

constexpr std::size_t PARAM_TYPE_COUNT = 9;
constexpr std::size_t PARAM_COUNT = 171;
/// Bytes that the catalogue addresses, without gaps: the length of a whole image.
constexpr std::uint32_t CONFIG_IMAGE_SIZE = 179;
/// What `paramGroup` returns for an unknown number; real groups are 0 to 7.
constexpr std::uint32_t NO_GROUP = 8;

/// One row of the catalogue: seven 32-bit words. Only the first four are used here; the others
/// belong to the process that writes the image and are kept as issued.
struct ParamDescriptor {
    std::uint32_t number; ///< 1 to 171, the row's position + 1
    ParamType type;       ///< index into the sizes below
    std::uint32_t group;  ///< 0 to 7
    std::uint32_t offset; ///< of the value in the image, in bytes
    std::uint32_t id;     ///< code << 16 | 0x00A0
    std::int32_t defaultValue;
    std::uint32_t mask;
};

/// The nine type sizes, followed immediately by the rows: 4,824 bytes of read-only data.
struct ParamTable {
    std::array<std::uint32_t, PARAM_TYPE_COUNT> typeSizes; ///< bytes, by type code
    std::array<ParamDescriptor, PARAM_COUNT> rows;         ///< by parameter number - 1
};

extern const ParamTable ParamCatalogue;

/// Size of a type in bytes; 1 for a code without an entry (9 and over), which is not an error.
std::uint32_t paramTypeSize(ParamType type);

/// Copies the row of parameter `number` to `descriptor`, its index (number - 1) to `index`, and
/// returns 0. For an unknown number (0, 172 and over) returns 1, sets `index` to -1 and leaves
/// `descriptor` unchanged.
std::uint32_t lookupParam(std::uint16_t number, std::int32_t& index, ParamDescriptor& descriptor);

/// Group of parameter `number`, 0 to 7, or NO_GROUP when the number is unknown.
std::uint32_t paramGroup(std::uint16_t number);

/// What the catalogue says about one parameter.
struct ParamInfo {
    std::uint16_t number;
    std::uint16_t type; ///< type code
    std::uint16_t size; ///< bytes
    std::uint16_t group;
};

/// Fills `info` and returns 0; returns 1 and leaves `info` unchanged when the number is unknown.
std::uint32_t describeParam(std::uint16_t number, ParamInfo& info);

} // namespace orvane
