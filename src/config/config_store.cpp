// SPDX-License-Identifier: Apache-2.0
#include "config/config_store.h"

#include "platform/shared_memory.h"

#include <fcntl.h>
#include <sys/mman.h>
#include <unistd.h>

#include <algorithm>
#include <cstddef>
#include <iterator>

namespace orvane {

namespace {

constexpr mode_t SHM_MODE = 0640;

} // namespace

CalibrationPath composeCalibrationPath() {
    CalibrationPath path;
    char* const end = std::copy(std::begin(CAL_FILE_DIR), std::end(CAL_FILE_DIR), path.data());
    end[-1] = '/'; // over the NUL
    std::copy(std::begin(CAL_FILE_NAME), std::end(CAL_FILE_NAME), end);
    return path;
}

ConfigStore::~ConfigStore() {
    close();
}

void ConfigStore::init() {
    descriptor = -1;
    data = nullptr;
    length = 0;
}

std::int32_t ConfigStore::open() {
    // Composed and never used, on purpose: there is no file to fall back on, and an absent object
    // means no configuration, even on a unit with a calibration file.
    static_cast<void>(composeCalibrationPath());

    const int opened = platform::openSharedMemory(CONFIG_SHM_NAME, O_RDONLY, SHM_MODE);
    if (opened == -1) {
        return STORE_NOT_FOUND;
    }
    lseek(opened, 0, SEEK_SET);
    const off_t size = lseek(opened, 0, SEEK_END);
    lseek(opened, 0, SEEK_SET);
    // Before the size is tested, so that an object that can't be measured is still closed by close.
    descriptor = opened;
    if (size < 0) {
        return STORE_NOT_FOUND;
    }
    const auto bytes = static_cast<std::size_t>(size);
    void* const mapped = mmap(nullptr, bytes, PROT_READ, MAP_PRIVATE, descriptor, 0);
    // Stored even when it is the failure value: close passes it to munmap, which refuses it.
    data = static_cast<const std::uint8_t*>(mapped);
    // Linux refuses to map 0 bytes. A system that maps them would leave the getters nothing to
    // read, so length 0 counts as a failure, whatever mmap says.
    if (bytes == 0 || mapped == MAP_FAILED) {
        close();
        return STORE_NOT_MAPPED;
    }
    length = static_cast<std::uint32_t>(size);
    return STORE_OPENED;
}

void ConfigStore::close() {
    if (data != nullptr) {
        munmap(const_cast<std::uint8_t*>(data), length); // NOLINT(*-const-cast): it writes nothing
        data = nullptr;
    }
    if (descriptor != -1) {
        ::close(descriptor);
        descriptor = -1;
    }
}

} // namespace orvane
