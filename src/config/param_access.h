// SPDX-License-Identifier: Apache-2.0
//
// The getters: the only way to read values from the configuration image. None checks an offset
// against the length of the image: the catalogue is trusted, on purpose.
#pragma once

#include "config/config_store.h"

#include <cstdint>

namespace orvane {

enum ParamStatus : std::uint32_t {
    PARAM_OK = 0,
    PARAM_UNKNOWN = 1,        ///< no such number, or a size that is neither 1 nor 2
    PARAM_WRONG_SIZE = 2,     ///< the parameter's size is not the getter's
    PARAM_STORE_NOT_OPEN = 3, ///< nothing is mapped
};

/// Reads parameter `number` of any supported size: one byte, or a 16-bit value that is
/// little-endian in the image and is returned in the processor's order. `value` must have room for
/// it. On any status but PARAM_OK, `value` is unchanged.
ParamStatus getParam(const ConfigStore& store, std::uint16_t number, void* value);

/// Reads a one-byte parameter; PARAM_WRONG_SIZE for any other. Otherwise like getParam.
ParamStatus getParamU8(const ConfigStore& store, std::uint16_t number, std::uint8_t* value);

/// Reads a two-byte parameter; PARAM_WRONG_SIZE for any other. Otherwise like getParam.
ParamStatus getParamU16(const ConfigStore& store, std::uint16_t number, std::uint16_t* value);

/// Opens `store` itself and reads parameters 1 to `count` into `values`, one 16-bit slot each (a
/// one-byte parameter is zero-extended, on a little-endian processor). Stops at the first failure.
/// Returns the last ParamStatus, or -1 or -2 from ConfigStore::open (`store` is then as open left
/// it). With `count` over 171 it returns 1, having zeroed values[171] and touched nothing beyond,
/// so `values` needs room for the smaller of `count` and 172. Leaves `store` closed.
std::int32_t readAllParams(ConfigStore& store, std::uint16_t* values, std::uint32_t count);

} // namespace orvane
