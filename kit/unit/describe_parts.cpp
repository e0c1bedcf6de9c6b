// SPDX-License-Identifier: Apache-2.0
#include "config/param_catalogue.h"
#include "config/record_slots.h"
#include "kit/description/unit_description.h"
#include "kit/description/value_places.h"
#include "kit/host/bytes.h"
#include "kit/host/descriptor.h"
#include "kit/host/host_file.h"
#include "kit/host/little_endian.h"
#include "kit/host/sparse_content.h"
#include "kit/tuning/tuning_description.h"
#include "kit/tuning/tuning_encode.h"
#include "kit/unit/describe_unit.h"
#include "tuning/dps_block.h"

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <filesystem>
#include <functional>
#include <map>
#include <optional>
#include <set>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace orvane::kit {

namespace {

/// Shorter files get no table of their own. In bytes.
constexpr std::uint64_t LEAST_SPARSE = 4096;
/// What an entry of such a table takes besides its bytes, in bytes.
constexpr std::uint64_t RUN_COST = 32;

/// Returns a part of `area` and sets it to zeros.
Bytes takePart(Bytes& area, std::int64_t begin, std::size_t length) {
    const auto at = static_cast<std::size_t>(begin);
    Bytes part = area.substr(at, length);
    area.replace(at, part.size(), part.size(), '\0');
    return part;
}

/// Takes the slots out of `area`, the record area.
void takeSlots(Bytes& area, DiskDescription& disk) {
    for (std::uint32_t slot = 0; slot < RECORD_SLOT_COUNT; ++slot) {
        if (!slotsWithin(slot).empty()) {
            continue;
        }
        const SlotPlace place = slotPlace(slot);
        const Bytes bytes = withoutTrailingZeros(
            takePart(area, static_cast<std::int64_t>(place.offset), place.size));
        if (!bytes.empty()) {
            disk.slots.emplace(slot, bytes);
        }
    }
}

void takeTuning(Bytes& area, DiskDescription& disk) {
    for (std::uint32_t id = 0; id < DPS_BLOCK_COUNT; ++id) {
        const auto begin = static_cast<std::int64_t>(id * DPS_BLOCK_SIZE);
        const Bytes bytes =
            takePart(area, RECORD_AREA_SIZE - TUNING_AREA_START + begin, DPS_BLOCK_SIZE);
        if (!isAllZero(bytes)) {
            DpsBlock block{};
            std::copy(bytes.begin(), bytes.end(), block.bytes.begin());
            disk.tuning.emplace(id, describeTuningBlock(block));
        }
    }
}

/// The offsets of the parts that are taken out of the area, and its end: what is left before and
/// after a part must not become one run.
std::set<std::uint64_t> bordersOfParts() {
    std::set<std::uint64_t> borders = {RECORD_AREA_SIZE - AUX_AREA_START,
                                       RECORD_AREA_SIZE - TUNING_AREA_START, RECORD_AREA_SIZE};
    for (std::uint32_t slot = 0; slot < RECORD_SLOT_COUNT; ++slot) {
        borders.insert(slotPlace(slot).offset);
    }
    return borders;
}

/// `area` is the record area, the last part of the disk.
void describeRecordArea(Bytes area, DiskDescription& disk) {
    takeSlots(area, disk);
    const Bytes aux =
        withoutTrailingZeros(takePart(area, RECORD_AREA_SIZE - AUX_AREA_START, AUX_AREA_SIZE));
    if (!aux.empty()) {
        disk.aux = aux;
    }
    takeTuning(area, disk);
    const std::uint64_t base = disk.size - static_cast<std::uint64_t>(RECORD_AREA_SIZE);
    std::size_t begin = 0;
    for (const std::uint64_t border : bordersOfParts()) {
        const auto end = static_cast<std::size_t>(border);
        disk.bytes.merge(
            sparseContent(std::string_view(area).substr(begin, end - begin), base + begin));
        begin = end;
    }
}

bool hasRecordArea(std::uint64_t size) {
    return size >= static_cast<std::uint64_t>(RECORD_AREA_SIZE);
}

} // namespace

ImageDescription describeImage(const Bytes& image) {
    ImageDescription description;
    description.size = static_cast<std::uint32_t>(image.size());
    Bytes rest = image;
    for (std::uint16_t number = 1; number <= PARAM_COUNT; ++number) {
        const ParamPlace place = paramPlace(number);
        if (place.offset + place.size > image.size()) {
            continue;
        }
        const std::uint64_t value = fromLittleEndian(takePart(rest, place.offset, place.size));
        if (value != 0) {
            description.params.emplace(number, static_cast<std::uint16_t>(value));
        }
    }
    for (auto& [offset, bytes] : sparseContent(rest)) {
        description.bytes.emplace(static_cast<std::uint32_t>(offset), bytes);
    }
    return description;
}

DiskDescription describeDisk(const Descriptor& descriptor, const std::filesystem::path& file,
                             std::uint64_t size) {
    DiskDescription disk;
    disk.size = size;
    const std::uint64_t base = hasRecordArea(size) ? size - RECORD_AREA_SIZE : size;
    disk.bytes = sparseContent(descriptor, file, base);
    if (hasRecordArea(size)) {
        Bytes area = readAt(descriptor, file, base, RECORD_AREA_SIZE);
        area.resize(RECORD_AREA_SIZE);
        describeRecordArea(std::move(area), disk);
    }
    return disk;
}

DiskDescription describeDisk(const Bytes& content) {
    DiskDescription disk;
    disk.size = content.size();
    const std::size_t base =
        hasRecordArea(disk.size) ? content.size() - RECORD_AREA_SIZE : content.size();
    disk.bytes = sparseContent(std::string_view(content).substr(0, base));
    if (hasRecordArea(disk.size)) {
        describeRecordArea(content.substr(base), disk);
    }
    return disk;
}

void describeFile(const Descriptor& descriptor, const std::filesystem::path& file,
                  const std::string& path, UnitDescription& unit) {
    const std::uint64_t size = sizeOf(descriptor, file);
    SparseContent runs = sparseContent(descriptor, file, size);
    std::uint64_t cost = 0;
    for (const auto& [offset, bytes] : runs) {
        cost += RUN_COST + bytes.size();
    }
    if (size >= LEAST_SPARSE && cost <= size / 2) {
        unit.sparseFiles[path] = {size, std::move(runs)};
        return;
    }
    Bytes content(static_cast<std::size_t>(size), '\0');
    for (const auto& [offset, bytes] : runs) {
        content.replace(static_cast<std::size_t>(offset), bytes.size(), bytes);
    }
    unit.files[path] = std::move(content);
}

} // namespace orvane::kit
