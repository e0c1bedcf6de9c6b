// SPDX-License-Identifier: Apache-2.0
#include "kit/unit.h"

#include "config/boot_disk.h"
#include "config/config_store.h"
#include "config/param_catalogue.h"
#include "config/record_area.h"
#include "kit/host_file.h"
#include "kit/kit_error.h"
#include "kit/root.h"
#include "kit/tuning_encode.h"
#include "kit/unit_checks.h"

#include <algorithm>

namespace orvane::kit {

namespace {

namespace fs = std::filesystem;

constexpr const char* UNIT_FOLDERS[] = {"/fs/mp/etc/mm", "/fs/rwdata/.Version", "/fs/tmpfs", "/dev",
                                        "/tmp"};

/// Where the unit's absolute `path` lies on the host.
fs::path onHost(const fs::path& root, const std::string& path) {
    checkUnitPath(path);
    return root / fs::path(path).relative_path();
}

/// Whether `path` is `ancestor` or lies below it.
bool isBelow(const std::string& path, const std::string& ancestor) {
    return path.compare(0, ancestor.size(), ancestor) == 0 &&
           (path.size() == ancestor.size() || path[ancestor.size()] == '/');
}

/// Image and disk give way to a file or folder of the same path, and need not be made to be
/// removed.
bool isMade(const UnitDescription& unit, const std::string& path) {
    const auto isFolder = [&path](const std::string& folder) { return folder == path; };
    const auto isRemoved = [&path](const std::string& absent) { return isBelow(path, absent); };
    return unit.files.count(path) == 0 &&
           std::none_of(unit.folders.begin(), unit.folders.end(), isFolder) &&
           std::none_of(unit.absent.begin(), unit.absent.end(), isRemoved);
}

void checkInside(const std::string& what, std::uint64_t end, std::uint64_t size,
                 const char* whole) {
    if (end > size) {
        throw KitError(what + " ends at byte " + std::to_string(end) + " of " + whole + " of " +
                       std::to_string(size) + " bytes");
    }
}

void makeImage(const ImageDescription& image, const fs::path& file) {
    const Descriptor descriptor = makeSparseFile(file, image.size);
    const auto put = [&](const std::string& what, std::uint64_t offset, const Bytes& bytes) {
        checkInside(what, offset + bytes.size(), image.size, "an image");
        writeAt(descriptor, file, offset, bytes);
    };
    for (const auto& [number, value] : image.params) {
        checkParam(number, value);
        std::int32_t index = 0;
        ParamDescriptor row{};
        lookupParam(number, index, row);
        Bytes bytes(1, static_cast<char>(value & 0xFFU));
        if (paramTypeSize(row.type) == 2) {
            bytes += static_cast<char>(value >> 8U);
        }
        put("parameter " + std::to_string(number), row.offset, bytes);
    }
    for (const auto& [offset, bytes] : image.bytes) {
        put("what stands at " + std::to_string(offset), offset, bytes);
    }
}

std::uint32_t lengthOf(const Bytes& bytes) {
    const std::uint64_t length = bytes.size();
    return static_cast<std::uint32_t>(length);
}

void expectWritten(std::int32_t result, const std::string& what, const DiskDescription& disk) {
    if (result != 0) {
        throw KitError(what + " does not fit on a disk of " + std::to_string(disk.size) + " bytes");
    }
}

/// Through the product's own operations, in a process that has entered the unit.
void writeRecords(const DiskDescription& disk) {
    for (const auto& [slot, bytes] : disk.slots) {
        checkSlot(slot, bytes);
        expectWritten(writeRecordSlot(slot, bytes.data(), lengthOf(bytes)),
                      "slot " + std::to_string(slot), disk);
    }
    if (disk.aux) {
        checkAux(*disk.aux);
        expectWritten(writeAuxArea(disk.aux->data(), lengthOf(*disk.aux)), "the auxiliary area",
                      disk);
    }
    if (!disk.tuning.empty()) {
        DpsArea area{};
        for (const auto& [id, block] : disk.tuning) {
            if (id >= area.size()) {
                throw KitError("there is no tuning block " + std::to_string(id));
            }
            area[id] = encodeTuningBlock(block);
        }
        expectWritten(writeTuningArea(area.data(), DPS_AREA_SIZE), "the tuning area", disk);
    }
}

void makeDisk(const DiskDescription& disk, const fs::path& file, const fs::path& root) {
    const Descriptor descriptor = makeSparseFile(file, disk.size);
    if (!disk.slots.empty() || disk.aux || !disk.tuning.empty()) {
        const EnteredRoot entered(root);
        writeRecords(disk);
    }
    for (const auto& [offset, bytes] : disk.bytes) {
        checkInside("what stands at " + std::to_string(offset), offset + bytes.size(), disk.size,
                    "a disk");
        writeAt(descriptor, file, offset, bytes);
    }
}

/// Makes everything below an empty `root`.
void fillRoot(const UnitDescription& unit, const fs::path& root) {
    for (const char* folder : UNIT_FOLDERS) {
        fs::create_directories(onHost(root, folder));
    }
    for (const std::string& folder : unit.folders) {
        fs::create_directories(onHost(root, folder));
    }
    if (isMade(unit, CONFIG_SHM_NAME)) {
        makeImage(unit.image, onHost(root, CONFIG_SHM_NAME));
    }
    if (isMade(unit, BOOT_DISK)) {
        makeDisk(unit.disk, onHost(root, BOOT_DISK), root);
    }
    for (const auto& [path, content] : unit.files) {
        const fs::path file = onHost(root, path);
        fs::create_directories(file.parent_path());
        writeAt(makeSparseFile(file, 0), file, 0, content);
    }
    for (const std::string& path : unit.absent) {
        fs::remove_all(onHost(root, path));
    }
}

/// Takes away what a failed attempt left behind, as far as the host lets it.
void undo(const fs::path& root, bool rootWasThere) {
    std::error_code ignored;
    if (!rootWasThere) {
        fs::remove_all(root, ignored);
        return;
    }
    for (const fs::directory_entry& entry : fs::directory_iterator(root, ignored)) {
        fs::remove_all(entry.path(), ignored);
    }
}

} // namespace

void makeUnit(const UnitDescription& unit, const fs::path& root) {
    std::error_code error;
    const fs::file_status status = fs::status(root, error);
    const bool isThere = fs::exists(status);
    if (isThere && (!fs::is_directory(status) || !fs::is_empty(root, error) || error)) {
        throw KitError(root.string() + " is there already and is not an empty folder");
    }
    if (!isThere && !fs::create_directory(root, error)) {
        throw KitError("cannot make " + root.string() + ": " + error.message());
    }
    try {
        fillRoot(unit, root);
    } catch (const fs::filesystem_error& failure) {
        undo(root, isThere);
        throw KitError("cannot make " + failure.path1().string() + ": " + failure.code().message());
    } catch (...) {
        undo(root, isThere);
        throw;
    }
}

} // namespace orvane::kit
