// SPDX-License-Identifier: Apache-2.0
#include "kit/unit/describe_inputs.h"

#include "config/boot_disk.h"
#include "config/config_store.h"
#include "config/record_slots.h"
#include "identity/software_version.h"
#include "kit/enter/entered_root.h"
#include "kit/host/descriptor.h"
#include "kit/host/host_file.h"
#include "kit/host/kit_error.h"
#include "kit/host/output_place.h"
#include "kit/host/tree_entries.h"
#include "kit/unit/describe_unit.h"
#include "main/unit_files.h"
#include "platform/shared_memory.h"
#include "tuning/audio_profile.h"
#include "writers/template_merge.h"

#include <fcntl.h>
#include <sys/stat.h>

#include <algorithm>
#include <cerrno>
#include <cstdint>
#include <system_error>
#include <utility>
#include <vector>

namespace orvane::kit {

namespace {

namespace fs = std::filesystem;

constexpr int FLAGS = O_RDONLY | O_NONBLOCK | O_CLOEXEC;

/// Whether the last failed call was about something that is not there.
bool isMissing() {
    return errno == ENOENT || errno == ENOTDIR || errno == ELOOP || errno == ENAMETOOLONG;
}

/// The type of what has just been opened as `path`, also if that failed; `none` when nothing is
/// there.
fs::file_type typeOf(const Descriptor& descriptor, const char* path) {
    if (!descriptor.isOpen() && isMissing()) {
        return fs::file_type::none;
    }
    struct stat state {};
    if (!descriptor.isOpen() || ::fstat(descriptor.number(), &state) != 0) {
        throw systemError(std::string("cannot read ") + path);
    }
    return S_ISDIR(state.st_mode)   ? fs::file_type::directory
           : S_ISREG(state.st_mode) ? fs::file_type::regular
                                    : fs::file_type::unknown;
}

/// Requires that the process has entered the unit.
class InputReader {
public:
    UnitInputs read() {
        readImage();
        readDisk();
        readVersionFiles();
        for (const AccessoryFile& file : ACCESSORY_FILES) {
            readFile(file.templateFile);
            readFile(file.stockFile);
        }
        findOutputs();
        std::sort(unit_.folders.begin(), unit_.folders.end());
        return std::move(inputs_);
    }

private:
    void readImage() {
        const Descriptor image(platform::openSharedMemory(CONFIG_SHM_NAME, FLAGS, 0));
        const fs::file_type type = typeOf(image, CONFIG_SHM_NAME);
        if (type == fs::file_type::none) {
            unit_.absent.emplace_back(CONFIG_SHM_NAME);
        } else if (type == fs::file_type::directory) {
            unit_.folders.emplace_back(CONFIG_SHM_NAME);
        } else if (sizeOf(image, CONFIG_SHM_NAME) <= LONGEST_IMAGE) {
            inputs_.image = readWhole(image, CONFIG_SHM_NAME);
        } else {
            describeFile(image, CONFIG_SHM_NAME, CONFIG_SHM_NAME, unit_);
        }
    }

    void readDisk() {
        const Descriptor disk(::open(BOOT_DISK, FLAGS));
        const fs::file_type type = typeOf(disk, BOOT_DISK);
        if (type == fs::file_type::none) {
            unit_.absent.emplace_back(BOOT_DISK);
        } else if (type == fs::file_type::directory) {
            unit_.folders.emplace_back(BOOT_DISK);
        } else {
            const std::uint64_t size = sizeOf(disk, BOOT_DISK);
            const std::uint64_t copied = std::min<std::uint64_t>(size, RECORD_AREA_SIZE);
            inputs_.disk = readAt(disk, BOOT_DISK, size - copied, copied);
        }
    }

    void readVersionFiles() {
        if (!isFolder(VERSION_DIR)) {
            return;
        }
        for (const fs::directory_entry& entry : listFolder(VERSION_DIR)) {
            const std::string path = VERSION_DIR + entry.path().filename().string();
            if (isVersionFile(path)) {
                readFile(path);
            }
        }
    }

    /// Looks before it opens: opening a device may have an effect.
    void readFile(const std::string& path) {
        struct stat state {};
        if (::stat(path.c_str(), &state) != 0) {
            if (!isMissing()) {
                throw systemError("cannot read " + path);
            }
        } else if (S_ISDIR(state.st_mode)) {
            unit_.folders.push_back(path);
        } else if (S_ISREG(state.st_mode)) {
            describeFile(openForReading(path), path, path, unit_);
        } else {
            throw KitError(path + " is neither a file nor a folder");
        }
    }

    void findOutputs() {
        if (!isFolder(OUTPUT_FOLDER)) {
            unit_.absent.emplace_back(OUTPUT_FOLDER);
            return;
        }
        for (const AccessoryFile& file : ACCESSORY_FILES) {
            findOutput(file.output);
        }
        for (const TuningOutput& output : TUNING_OUTPUTS) {
            findOutput(output.path);
        }
    }

    void findOutput(const char* path) {
        if (!canBeWritten(path)) {
            unit_.folders.emplace_back(path);
        }
    }

    static bool isFolder(const char* path) {
        std::error_code error;
        return fs::is_directory(path, error);
    }

    UnitInputs inputs_;
    UnitDescription& unit_ = inputs_.unit;
};

} // namespace

UnitInputs readInputs(const fs::path& source) {
    const EnteredRoot entered(source);
    return InputReader().read();
}

UnitDescription descriptionOf(UnitInputs inputs) {
    if (inputs.image) {
        inputs.unit.image = describeImage(*inputs.image);
    }
    if (inputs.disk) {
        inputs.unit.disk = describeDisk(*inputs.disk);
    }
    return std::move(inputs.unit);
}

UnitDescription describeInputs(const fs::path& source) {
    return descriptionOf(readInputs(source));
}

} // namespace orvane::kit
