// SPDX-License-Identifier: Apache-2.0
#include "kit/unit/describe_inputs.h"

#include "config/boot_disk.h"
#include "config/config_store.h"
#include "config/record_slots.h"
#include "identity/software_version.h"
#include "kit/description/unit_layout.h"
#include "kit/enter/entered_root.h"
#include "kit/host/descriptor.h"
#include "kit/host/host_file.h"
#include "kit/host/input_kind.h"
#include "kit/host/output_place.h"
#include "kit/host/tree_entries.h"
#include "kit/tuning/tuning_description.h"
#include "kit/unit/describe_unit.h"
#include "main/unit_files.h"
#include "tuning/audio_profile.h"
#include "writers/template_merge.h"

#include <algorithm>
#include <cstdint>
#include <map>
#include <utility>
#include <vector>

namespace orvane::kit {

namespace {

namespace fs = std::filesystem;

using Paths = std::vector<std::string>;

/// The paths of one file that a run opens.
struct FilePaths {
    bool isThere = false;
    Paths inputs;
    Paths outputs;
};

/// Requires that the process has entered the unit.
class InputReader {
public:
    explicit InputReader(bool isRunningSystem) : isRunningSystem_(isRunningSystem) {}

    UnitInputs read() {
        readImage();
        readDisk();
        readVersionFiles();
        for (const AccessoryFile& file : ACCESSORY_FILES) {
            readFile(file.templateFile);
            readFile(file.stockFile);
        }
        findOutputs();
        linkSharedFiles();
        std::sort(unit_.folders.begin(), unit_.folders.end());
        addAbsent(layoutOf({}), isThere, unit_);
        return std::move(inputs_);
    }

private:
    void readImage() {
        const InputKind kind = lookAtMappedInput(CONFIG_SHM_NAME);
        if (kind == InputKind::folder) {
            unit_.folders.emplace_back(CONFIG_SHM_NAME);
        } else if (kind != InputKind::missing) {
            const Descriptor image = openForReading(CONFIG_SHM_NAME);
            if (sizeOf(image, CONFIG_SHM_NAME) <= LONGEST_IMAGE) {
                inputs_.image = readWhole(image, CONFIG_SHM_NAME);
            } else {
                describeFile(image, CONFIG_SHM_NAME, CONFIG_SHM_NAME, unit_);
            }
        }
    }

    void readDisk() {
        const InputKind kind = lookAtPositionedInput(BOOT_DISK);
        if (kind == InputKind::folder) {
            unit_.folders.emplace_back(BOOT_DISK);
        } else if (kind != InputKind::missing) {
            const Descriptor disk = openForReading(BOOT_DISK);
            const std::uint64_t size = sizeOf(disk, BOOT_DISK);
            const std::uint64_t copied = std::min<std::uint64_t>(size, RECORD_AREA_SIZE);
            inputs_.disk = readAt(disk, BOOT_DISK, size - copied, copied);
        }
    }

    void readVersionFiles() {
        if (lookAtSequentialInput(VERSION_DIR) != InputKind::folder) {
            return;
        }
        for (const fs::directory_entry& entry : listFolder(VERSION_DIR)) {
            const std::string name = entry.path().filename().string();
            const std::string path = VERSION_DIR + name;
            if (isVersionFile(path) && readFile(path) == InputKind::missing) {
                unit_.links[path] = name; // it is listed, and can't be opened
            }
        }
    }

    InputKind readFile(const std::string& path) {
        const InputKind kind = lookAtSequentialInput(path);
        if (kind == InputKind::folder) {
            unit_.folders.push_back(path);
        } else if (kind == InputKind::file) {
            describeFile(openForReading(path), path, path, unit_);
        }
        return kind;
    }

    void findOutputs() {
        if (!isThere(OUTPUT_FOLDER, EntryKind::folder)) {
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
        if (!canBeOpened(path, isRunningSystem_)) {
            unit_.folders.emplace_back(path);
        }
    }

    /// What a run writes to one path of a file, it reads or overwrites at the others: such paths
    /// stay one file if an output is among them.
    void linkSharedFiles() {
        std::map<std::string, FilePaths> files;
        for (const AccessoryFile& file : ACCESSORY_FILES) {
            addPath(file.templateFile, &FilePaths::inputs, files);
            addPath(file.stockFile, &FilePaths::inputs, files);
            addPath(file.output, &FilePaths::outputs, files);
        }
        for (const TuningOutput& output : TUNING_OUTPUTS) {
            addPath(output.path, &FilePaths::outputs, files);
        }
        for (const auto& [name, paths] : files) {
            if (!paths.outputs.empty()) {
                const bool hasContent = paths.isThere && !paths.inputs.empty();
                const Paths& kept = hasContent ? paths.inputs : paths.outputs;
                link(paths.inputs, kept.front());
                link(paths.outputs, kept.front());
            }
        }
    }

    static void addPath(const char* path, Paths FilePaths::*role,
                        std::map<std::string, FilePaths>& files) {
        const std::optional<OutputPlace> place = findOutputPlace(path);
        if (place && keepsBytes(*place)) {
            FilePaths& file = files[fileName(*place)];
            file.isThere = place->kind != 0;
            (file.*role).emplace_back(path);
        }
    }

    void link(const Paths& paths, const std::string& target) {
        for (const std::string& path : paths) {
            if (path != target) {
                unit_.files.erase(path);
                unit_.sparseFiles.erase(path);
                unit_.links[path] = target;
            }
        }
    }

    /// Whether the source has an entry that every unit has: a folder, the image, or the disk.
    static bool isThere(const std::string& path, EntryKind kind) {
        if (kind == EntryKind::folder) {
            return kindBehind(path) == fs::file_type::directory;
        }
        const auto look = kind == EntryKind::disk ? lookAtPositionedInput : lookAtMappedInput;
        return look(path) != InputKind::missing;
    }

    bool isRunningSystem_;
    UnitInputs inputs_;
    UnitDescription& unit_ = inputs_.unit;
};

} // namespace

UnitInputs readInputs(const fs::path& source) {
    const EnteredRoot entered(source);
    return InputReader(entered.isRunningSystem()).read();
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
