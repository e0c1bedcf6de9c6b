// SPDX-License-Identifier: Apache-2.0
#include "config/record_slots.h"

#include <array>

namespace orvane {

namespace {

struct RecordSlot {
    std::uint32_t size;   ///< bytes
    std::uint64_t offset; ///< bytes from the area's base
};

// By slot number. Bytes 137 to 2184 belong to no slot.
// clang-format off
constexpr std::array<RecordSlot, RECORD_SLOT_COUNT> RECORD_SLOTS = {{
    {  1,    0}, // 0
    { 16,    1}, // 1
    { 16,   17}, // 2
    { 16,   33}, // 3
    { 16,   49}, // 4
    { 16,   65}, // 5
    { 16,   81}, // 6
    { 16,   97}, // 7
    { 16,  113}, // 8
    {  8,  129}, // 9: the unit's serial text
    {  1, 2185}, // 10
    {  1, 2186}, // 11
    {  1, 2187}, // 12
    {  1, 2188}, // 13
    {  1, 2189}, // 14
    {136,    1}, // 15: slots 1 to 9 again as one block, on purpose: the range of the CRC
    { 24, 2190}, // 16
    {  2, 2214}, // 17
}};
// clang-format on

} // namespace

void recordSlotLayout(std::uint32_t slot, std::uint32_t& size, std::uint64_t& offset) {
    if (slot < RECORD_SLOTS.size()) {
        size = RECORD_SLOTS[slot].size;
        offset = RECORD_SLOTS[slot].offset;
    }
}

} // namespace orvane
