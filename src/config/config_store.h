// SPDX-License-Identifier: Apache-2.0
//
// Read-only access to the vehicle configuration image, which another process of the unit publishes
// as a shared-memory object. The bytes are mapped, not interpreted: the catalogue
// (param_catalogue.h) has their layout.
#pragma once

#include <array>
#include <cstdint>

namespace orvane {

/// Name of the shared-memory object: a full path, not the usual single-slash name.
constexpr char CONFIG_SHM_NAME[] = "/fs/tmpfs/VS_DIAG_SERVICE_CONFIG_SHARED_MEM";

/// Directory and name of the calibration file, which nothing here opens (see ConfigStore::open).
constexpr char CAL_FILE_DIR[] = "/fs/rwdata/CALS";
constexpr char CAL_FILE_NAME[] = "cal_active.bin";

/// The calibration file's path, with its NUL. ConfigStore::open composes it and never uses it.
using CalibrationPath = std::array<char, sizeof CAL_FILE_DIR + sizeof CAL_FILE_NAME>;
CalibrationPath composeCalibrationPath();

/// What ConfigStore::open returns.
enum ConfigStoreResult : std::int32_t {
    STORE_OPENED = 0,
    STORE_NOT_MAPPED = -1, ///< the object exists but can't be mapped
    STORE_NOT_FOUND = -2,  ///< the object can't be opened or measured
};

/// The handle on the mapped image: init, open, one getter, close. It owns the descriptor and the
/// mapping.
struct ConfigStore {
    std::int32_t descriptor = -1;       ///< of the shared-memory object; -1 when closed
    const std::uint8_t* data = nullptr; ///< the mapped bytes; null when nothing is mapped
    std::uint32_t length = 0; ///< bytes mapped, as measured at open; no getter consults it

    ConfigStore() = default;
    ~ConfigStore();
    ConfigStore(const ConfigStore&) = delete;
    ConfigStore& operator=(const ConfigStore&) = delete;

    /// Puts the handle into the closed state without releasing anything.
    void init();

    /// Maps the object and validates nothing in it. Returns a ConfigStoreResult. STORE_NOT_FOUND:
    /// the object can't be opened (the handle is untouched) or measured (the descriptor stays in
    /// the handle until close). STORE_NOT_MAPPED, also for an empty object: the handle is closed.
    /// Don't open an open handle: what it holds would leak.
    std::int32_t open();

    /// Releases what is held. Safe on a closed handle and safe to repeat. `length` keeps its value.
    void close();
};

} // namespace orvane
