// SPDX-License-Identifier: Apache-2.0
#include "identity/vehicle_identity.h"

#include "config/config_store.h"
#include "config/param_access.h"
#include "config/record_area.h"
#include "identity/model_names.h"

#include <array>
#include <cstddef>

namespace orvane {

namespace {

/// The value of a one-byte parameter; 0 when it can't be read, so that a missing image and a stored
/// 0 give the same result everywhere.
std::uint8_t paramOrZero(std::uint16_t number) {
    std::uint8_t value = 0;
    ConfigStore store;
    store.init();
    if (store.open() == STORE_OPENED) {
        getParamU8(store, number, &value); // leaves 0 when it fails
        store.close();
    }
    return value;
}

} // namespace

unsigned int getRightHandDrive() {
    return paramOrZero(RIGHT_HAND_DRIVE_PARAM);
}

void getBrandName(std::string& brand) {
    constexpr std::uint8_t SECOND_BRAND = 2;
    brand = paramOrZero(BRAND_PARAM) == SECOND_BRAND ? "QUARION" : "MARL";
}

void getFuelType(std::string& fuelType) {
    switch (paramOrZero(FUEL_TYPE_PARAM)) {
    case 2:
        fuelType = "cng";
        break;
    case 3:
        fuelType = "electric";
        break;
    case 1:
        fuelType = "diesel";
        break;
    default:
        fuelType = "gasoline";
        break;
    }
}

void getModelName(std::string& model) {
    const std::uint8_t code = paramOrZero(MODEL_PARAM);
    try {
        model = hasModelName(code) ? ModelNameTable[code - 1U] : MODEL_NAME_FALLBACK;
    } catch (...) {
        model = MODEL_NAME_FALLBACK; // so short that most libraries need no memory
    }
}

void getUnitSerial(std::string& serial) {
    // Longer than the slot's 8 bytes, so that the text is always terminated.
    constexpr std::size_t SERIAL_BUFFER_SIZE = 12;
    std::array<char, SERIAL_BUFFER_SIZE> text{};
    if (readRecordSlot(SERIAL_RECORD_SLOT, text.data(), text.size()) != 0) {
        serial = DEFAULT_UNIT_SERIAL;
        return;
    }
    serial = text.data();
}

} // namespace orvane
