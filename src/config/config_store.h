// SPDX-License-Identifier: Apache-2.0
//
// Read-only access to the vehicle configuration image, which another process of the unit publishes
// as a shared-memory object. The bytes are mapped and not interpreted: layout and meaning are the
// catalogue's (param_catalogue.h).
#pragma once

#include <array>
#include <cstdint>

namespace orvane {

/// Name of the shared-memory object: a full path, not the usual single-slash name.
constexpr char CONFIG_SHM_NAME[] = "/fs/tmpfs/VS_DIAG_SERVICE_CONFIG_SHARED_MEM";

/// Directory and name of the calibration file, which nothing here opens (see ConfigStore::open).
constexpr char CAL_FILE_DIR[] = "/fs/rwdata/CALS";
constexpr char CAL_FILE_NAME[] = "cal_active.bin";

/// The calibration file's path, with a NUL behind it. ConfigStore::open composes it and does
/// nothing with it.
using CalibrationPath = std::array<char, sizeof CAL_FILE_DIR + sizeof CAL_FILE_NAME>;
CalibrationPath composeCalibrationPath();

/// What ConfigStore::open answers.
enum ConfigStoreResult : std::int32_t {
    STORE_OPENED = 0,
    STORE_NOT_MAPPED = -1, ///< the object is there, and can't be mapped
    STORE_NOT_FOUND = -2,  ///< the object can't be opened, or not measured
};

/// The handle on the mapped image: init, open, one getter, close. It owns descriptor and mapping.
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

    /// Maps the object as it stands; nothing in it is validated.
    /// Returns a ConfigStoreResult. STORE_NOT_FOUND: the object can't be opened (handle untouched)
    /// or not measured (the descriptor stays in the handle until close). STORE_NOT_MAPPED, for an
    /// empty object, too: the handle is closed. An open handle must not be opened again: what it
    /// held would leak.
    std::int32_t open();

    /// Releases what is held. Safe on a closed handle and safe to repeat. `length` keeps its value.
    void close();
};

} // namespace orvane
