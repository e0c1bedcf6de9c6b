// SPDX-License-Identifier: Apache-2.0
#include "kit/description/value_places.h"

#include "config/record_slots.h"
#include "kit/tuning/tuning_encode.h"
#include "tuning/dps_block.h"

#include <array>
#include <cstddef>
#include <utility>

namespace orvane::kit {

namespace {

using Kind = ValueKey::Kind;

constexpr std::uint64_t AREA_SIZE = RECORD_AREA_SIZE;
constexpr char ALL_BITS = '\xFF';

ValuePlace imagePlace(const ParamPlace& param) {
    return {false, param.offset, Bytes(param.size, ALL_BITS),
            std::uint64_t{param.offset} + param.size};
}

/// A place whose first byte must lie on the disk.
ValuePlace recordPlace(std::uint64_t offset, std::uint32_t size) {
    return {true, offset, Bytes(size, ALL_BITS), AREA_SIZE - offset};
}

ValuePlace tuningPlace(std::uint64_t block, std::size_t offset, Bytes mask) {
    return {true, AREA_SIZE - TUNING_AREA_START + block * DPS_BLOCK_SIZE + offset, std::move(mask),
            TUNING_AREA_START};
}

ValuePlace fieldPlace(std::uint64_t block, const DpsField& field) {
    Bytes mask(dpsElementSize(field.encoding) * field.count, ALL_BITS);
    if (field.encoding == DpsEncoding::code2) {
        mask[0] = static_cast<char>(3U << field.bit);
    }
    return tuningPlace(block, field.offset, mask);
}

/// The bits of a block that fields read.
Bytes bitsOfFields() {
    DpsBlock block{};
    block.bytes.fill(0xFF);
    Bytes mask;
    for (const std::uint8_t rest : withoutFields(block).bytes) {
        mask += static_cast<char>(~rest);
    }
    return mask;
}

} // namespace

ParamDescriptor paramRow(std::uint16_t number) {
    std::int32_t index = 0;
    ParamDescriptor row{};
    lookupParam(number, index, row);
    return row;
}

ParamPlace paramPlace(std::uint16_t number) {
    const ParamDescriptor row = paramRow(number);
    return {row.offset, paramTypeSize(row.type)};
}

SlotPlace slotPlace(std::uint32_t slot) {
    SlotPlace place{0, 0};
    recordSlotLayout(slot, place.size, place.offset);
    return place;
}

std::vector<std::uint32_t> slotsWithin(std::uint32_t slot) {
    const SlotPlace whole = slotPlace(slot);
    std::vector<std::uint32_t> slots;
    for (std::uint32_t other = 0; other < RECORD_SLOT_COUNT; ++other) {
        const SlotPlace part = slotPlace(other);
        if (other != slot && part.offset >= whole.offset &&
            part.offset + part.size <= whole.offset + whole.size) {
            slots.push_back(other);
        }
    }
    return slots;
}

std::uint64_t ValuePlace::offsetIn(std::uint64_t size) const {
    return isOnDisk ? size + offset - AREA_SIZE : offset;
}

ValuePlace valuePlace(const ValueKey& key) {
    switch (key.kind) {
    case Kind::param:
        return imagePlace(paramPlace(static_cast<std::uint16_t>(key.number)));
    case Kind::slot: {
        const SlotPlace slot = slotPlace(static_cast<std::uint32_t>(key.number));
        return recordPlace(slot.offset, slot.size);
    }
    case Kind::slotByte: {
        const SlotPlace slot = slotPlace(static_cast<std::uint32_t>(key.number));
        ValuePlace place = recordPlace(slot.offset, 1);
        place.offset += key.offset;
        return place;
    }
    case Kind::aux:
        return recordPlace(AREA_SIZE - AUX_AREA_START, AUX_AREA_SIZE);
    case Kind::tuningBlock:
        return tuningPlace(key.number, 0, bitsOfFields());
    case Kind::tuningField:
        return fieldPlace(key.number, tuningField(key.name));
    case Kind::none:
    case Kind::imageSize:
    case Kind::imageBytes:
    case Kind::tuningRaw:
    case Kind::diskBytes:
    case Kind::file:
    case Kind::fileBytes:
    case Kind::link:
    case Kind::folder:
    case Kind::absent:
        break;
    }
    return {};
}

std::string valueName(const ValueKey& key) {
    const std::string number = std::to_string(key.number);
    switch (key.kind) {
    case Kind::param:
        return "parameter " + number;
    case Kind::slot:
        return "slot " + number;
    case Kind::slotByte:
        return "byte " + std::to_string(key.offset) + " of slot " + number;
    case Kind::aux:
        return "the auxiliary area";
    case Kind::tuningBlock:
        return "tuning block " + number;
    case Kind::tuningField:
        return key.name + " of tuning block " + number;
    case Kind::imageBytes:
    case Kind::diskBytes:
    case Kind::fileBytes:
        return "the content at " + std::to_string(key.offset);
    case Kind::none:
    case Kind::imageSize:
    case Kind::tuningRaw:
    case Kind::file:
    case Kind::link:
    case Kind::folder:
    case Kind::absent:
        break;
    }
    return key.name;
}

std::string placeFault(const ValueKey& key, std::uint64_t size) {
    const ValuePlace place = valuePlace(key);
    if (size >= place.leastSize) {
        return {};
    }
    if (!place.isOnDisk) {
        return pastTheEnd(valueName(key), place.offset, place.mask.size(), size, "an image");
    }
    const bool isTuning = key.kind == Kind::tuningBlock || key.kind == Kind::tuningField;
    return (isTuning ? "the tuning area" : valueName(key)) + " does not fit on a disk of " +
           std::to_string(size) + " bytes: it needs " + std::to_string(place.leastSize);
}

std::string pastTheEnd(const std::string& what, std::uint64_t offset, std::uint64_t length,
                       std::uint64_t size, const char* whole) {
    if (offset <= size && length <= size - offset) {
        return {};
    }
    return what + " ends at byte " + std::to_string(offset + length) + " of " + whole + " of " +
           std::to_string(size) + " bytes";
}

} // namespace orvane::kit
