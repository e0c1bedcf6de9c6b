// SPDX-License-Identifier: Apache-2.0
#include "kit/unit/redact_serial.h"

#include "config/record_slots.h"
#include "kit/description/unit_description.h"
#include "kit/host/bytes.h"

#include <cstddef>
#include <cstdint>
#include <map>
#include <optional>
#include <string>

namespace orvane::kit {

namespace {

constexpr std::uint32_t SERIAL_SLOT = 9;
/// A shorter serial may stand anywhere by chance. In bytes.
constexpr std::size_t LEAST_TOLD = 4;

void redact(const Bytes& serial, Bytes& bytes) {
    for (std::size_t at = bytes.find(serial); at != Bytes::npos;
         at = bytes.find(serial, at + serial.size())) {
        bytes.replace(at, serial.size(), serial.size(), 'X');
    }
}

} // namespace

void redactSerial(UnitInputs& inputs) {
    std::uint32_t size = 0;
    std::uint64_t offset = 0;
    recordSlotLayout(SERIAL_SLOT, size, offset);
    const std::uint64_t bytesBeforeEnd = static_cast<std::uint64_t>(RECORD_AREA_SIZE) - offset;
    if (!inputs.disk || inputs.disk->size() < bytesBeforeEnd) {
        return;
    }
    Bytes& disk = *inputs.disk;
    const std::size_t begin = disk.size() - static_cast<std::size_t>(bytesBeforeEnd);
    const Bytes slot = disk.substr(begin, size);
    const Bytes serial = slot.substr(0, slot.find('\0'));
    disk.replace(begin, size, size, '\0');
    disk.replace(begin, serial.size(), serial.size(), 'X');
    if (serial.size() < LEAST_TOLD) {
        return;
    }
    redact(serial, disk);
    for (auto& [path, content] : inputs.unit.files) {
        redact(serial, content);
    }
    for (auto& [path, content] : inputs.unit.sparseFiles) {
        for (auto& [at, bytes] : content.bytes) {
            redact(serial, bytes); // holds no zero, so that no serial goes beyond a run
        }
    }
}

} // namespace orvane::kit
