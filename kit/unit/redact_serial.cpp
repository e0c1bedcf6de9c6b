// SPDX-License-Identifier: Apache-2.0
#include "kit/unit/redact_serial.h"

#include "identity/vehicle_identity.h"
#include "kit/description/unit_description.h"
#include "kit/description/value_key.h"
#include "kit/description/value_places.h"
#include "kit/host/bytes.h"

#include <cstddef>
#include <map>
#include <optional>
#include <string>

namespace orvane::kit {

namespace {

/// A shorter serial may occur anywhere by chance. In bytes.
constexpr std::size_t SHORTEST_SOUGHT = 4;

void redact(const Bytes& serial, Bytes& bytes) {
    for (std::size_t at = bytes.find(serial); at != Bytes::npos;
         at = bytes.find(serial, at + serial.size())) {
        bytes.replace(at, serial.size(), serial.size(), 'X');
    }
}

} // namespace

void redactSerial(UnitInputs& inputs) {
    const ValuePlace place = valuePlace(slotKey(SERIAL_RECORD_SLOT));
    if (!inputs.disk || inputs.disk->size() < place.leastSize) {
        return;
    }
    Bytes& disk = *inputs.disk;
    const auto begin = static_cast<std::size_t>(place.offsetIn(disk.size()));
    const std::size_t size = place.mask.size();
    const Bytes slot = disk.substr(begin, size);
    const Bytes serial = slot.substr(0, slot.find('\0'));
    disk.replace(begin, size, size, '\0');
    disk.replace(begin, serial.size(), serial.size(), 'X');
    if (serial.size() < SHORTEST_SOUGHT) {
        return;
    }
    redact(serial, disk);
    for (auto& [path, content] : inputs.unit.files) {
        redact(serial, content);
    }
    for (auto& [path, content] : inputs.unit.sparseFiles) {
        for (auto& [at, bytes] : content.bytes) {
            redact(serial, bytes); // a serial has no zero, so it lies within one run
        }
    }
}

} // namespace orvane::kit
