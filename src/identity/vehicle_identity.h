// SPDX-License-Identifier: Apache-2.0
//
// The display values of the vehicle and of the unit. Each lookup opens its source, reads one value
// and closes the source. None reports a failure: where the source is missing or the value unknown,
// it gives a default. Where even a short string needs memory (GCC before 5), a lookup may throw
// std::bad_alloc.
#pragma once

#include <cstdint>
#include <string>

namespace orvane {

constexpr std::uint16_t RIGHT_HAND_DRIVE_PARAM = 22;
constexpr std::uint16_t BRAND_PARAM = 36;
constexpr std::uint16_t FUEL_TYPE_PARAM = 50;
constexpr std::uint16_t MODEL_PARAM = 139;
constexpr std::uint32_t SERIAL_RECORD_SLOT = 9;

/// Eleven characters, more than a serial slot holds, on purpose.
constexpr char DEFAULT_UNIT_SERIAL[] = "ABCD1234abc";
constexpr char MODEL_NAME_FALLBACK[] = "VOXA";

/// The raw value of RIGHT_HAND_DRIVE_PARAM, 0 to 255, on purpose not reduced to 0 or 1. 0 when
/// there is none.
unsigned int getRightHandDrive();

/// Sets `brand` to "QUARION" for brand code 2, else to "MARL".
void getBrandName(std::string& brand);

/// Sets `fuelType` to "diesel" (1), "cng" (2), "electric" (3), else to "gasoline".
void getFuelType(std::string& fuelType);

/// Sets `model` to the ModelNameTable entry of the model code, or to MODEL_NAME_FALLBACK.
void getModelName(std::string& model);

/// Sets `serial` to the serial text of the record area up to its first NUL, 0 to 8 bytes, whatever
/// they are; to DEFAULT_UNIT_SERIAL when the area can't be read. A record of zeros gives "".
void getUnitSerial(std::string& serial);

} // namespace orvane
