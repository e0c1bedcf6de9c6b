// SPDX-License-Identifier: Apache-2.0
#include "config/param_access.h"

#include "config/param_catalogue.h"

#include <cstring>

namespace orvane {

namespace {

/// For `readParam`: any size that it can read.
constexpr std::uint32_t ANY_SIZE = 0;

/// The read behind all getters. The order of its checks decides which status wins.
ParamStatus readParam(const ConfigStore& store, std::uint16_t number, std::uint32_t wantedSize,
                      void* value) {
    std::int32_t index = 0;
    ParamDescriptor descriptor{};
    if (lookupParam(number, index, descriptor) != 0) {
        return PARAM_UNKNOWN;
    }
    const std::uint32_t size = paramTypeSize(descriptor.type);
    if (wantedSize != ANY_SIZE && size != wantedSize) {
        return PARAM_WRONG_SIZE;
    }
    if (store.descriptor == -1 || store.data == nullptr) {
        return PARAM_STORE_NOT_OPEN;
    }
    // Not checked against store.length, on purpose: the catalogue defines the layout. Past the end
    // of a short image, the rest of its page is read.
    const std::uint8_t* bytes = store.data + descriptor.offset;
    if (size == 1) {
        std::memcpy(value, bytes, 1);
        return PARAM_OK;
    }
    // Two bytes: no row of the catalogue has more.
    const auto word = static_cast<std::uint16_t>(bytes[0] | bytes[1] << 8);
    std::memcpy(value, &word, sizeof word);
    return PARAM_OK;
}

} // namespace

ParamStatus getParam(const ConfigStore& store, std::uint16_t number, void* value) {
    return readParam(store, number, ANY_SIZE, value);
}

ParamStatus getParamU8(const ConfigStore& store, std::uint16_t number, std::uint8_t* value) {
    return readParam(store, number, sizeof *value, value);
}

ParamStatus getParamU16(const ConfigStore& store, std::uint16_t number, std::uint16_t* value) {
    return readParam(store, number, sizeof *value, value);
}

std::int32_t readAllParams(ConfigStore& store, std::uint16_t* values, std::uint32_t count) {
    const std::int32_t opened = store.open();
    if (opened != STORE_OPENED) {
        return opened;
    }
    ParamStatus status = PARAM_OK;
    // Parameter 172 fails at the latest, so the 16-bit number never overflows.
    for (std::uint16_t number = 1; number <= count && status == PARAM_OK; ++number) {
        values[number - 1] = 0; // a one-byte parameter fills the low half only
        status = getParam(store, number, &values[number - 1]);
    }
    store.close();
    return static_cast<std::int32_t>(status);
}

} // namespace orvane
