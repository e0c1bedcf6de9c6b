// SPDX-License-Identifier: Apache-2.0
#include "kit/description/conflicts.h"

#include "config/boot_disk.h"
#include "config/config_store.h"
#include "config/param_catalogue.h"
#include "config/record_slots.h"

#include <map>
#include <utility>
#include <vector>

namespace orvane::kit {

namespace {

/// Finds what stands where the path or something above it shall stand.
class PathCheck {
public:
    std::optional<Misfit> misfit;

    void enter(const std::string& path, EntryKind kind) {
        const auto [entry, isNew] = entries_.emplace(path, kind);
        const bool isFolderAgain = entry->second == kind && kind == EntryKind::folder;
        if (!isNew && !isFolderAgain && !misfit) {
            const std::string one = name(entry->second);
            const std::string other = name(kind);
            std::string what = path;
            what += one == other ? " is given twice" : " is both " + one + " and " + other;
            misfit = {path, what};
        }
    }

    void findBelow() {
        for (const auto& [path, kind] : entries_) {
            for (std::string above = pathAbove(path); !above.empty(); above = pathAbove(above)) {
                const auto taken = entries_.find(above);
                if (!misfit && taken != entries_.end() && taken->second != EntryKind::folder) {
                    std::string what = path;
                    what += " lies below " + above;
                    what.append(", which is ").append(name(taken->second)).append(", not a folder");
                    misfit = {path, what};
                }
            }
        }
    }

private:
    static const char* name(EntryKind kind) {
        switch (kind) {
        case EntryKind::folder:
            return "a folder";
        case EntryKind::link:
            return "a link";
        case EntryKind::file:
        case EntryKind::sparseFile:
        case EntryKind::image:
        case EntryKind::disk:
            break;
        }
        return "a file";
    }

    Layout entries_;
};

template <class Map, class PartName>
std::optional<Misfit> findBytesMisfit(const Map& bytes, std::uint64_t size, const char* whole,
                                      const PartName& partName) {
    for (const auto& [offset, content] : bytes) {
        const std::string what = pastTheEnd("what stands at " + std::to_string(offset), offset,
                                            content.size(), size, whole);
        if (!what.empty()) {
            return Misfit{partName(offset), what};
        }
    }
    return {};
}

std::optional<Misfit> findImageMisfit(const ImageDescription& image) {
    for (const auto& [number, value] : image.params) {
        const ParamPlace place = paramPlace(number);
        const std::string what = pastTheEnd("parameter " + std::to_string(number), place.offset,
                                            place.size, image.size, "an image");
        if (!what.empty()) {
            return Misfit{paramPart(number), what};
        }
    }
    return findBytesMisfit(image.bytes, image.size, "an image", imageBytesPart);
}

std::optional<Misfit> findDiskMisfit(const DiskDescription& disk) {
    for (const auto& [slot, bytes] : disk.slots) {
        if (disk.size < leastDiskForSlot(slot)) {
            return Misfit{slotPart(slot), tooSmallDisk("slot " + std::to_string(slot), disk.size,
                                                       leastDiskForSlot(slot))};
        }
    }
    if (disk.aux && disk.size < leastDiskForAux()) {
        return Misfit{AUX_PART, tooSmallDisk("the auxiliary area", disk.size, leastDiskForAux())};
    }
    if (!disk.tuning.empty() && disk.size < leastDiskForTuning()) {
        return Misfit{tuningPart(disk.tuning.begin()->first),
                      tooSmallDisk("the tuning area", disk.size, leastDiskForTuning())};
    }
    return findBytesMisfit(disk.bytes, disk.size, "a disk", diskBytesPart);
}

} // namespace

std::optional<Misfit> findPathMisfit(const UnitDescription& unit) {
    PathCheck check;
    for (const auto& [path, content] : unit.files) {
        check.enter(path, EntryKind::file);
    }
    for (const auto& [path, content] : unit.sparseFiles) {
        check.enter(path, EntryKind::sparseFile);
    }
    for (const auto& [path, target] : unit.links) {
        check.enter(path, EntryKind::link);
    }
    for (const std::string& path : unit.folders) {
        check.enter(path, EntryKind::folder);
    }
    check.findBelow();
    return check.misfit;
}

std::optional<Misfit> findSizeMisfit(const UnitDescription& unit, const Layout& layout) {
    const auto isMade = [&layout](const char* path, EntryKind kind) {
        const auto entry = layout.find(path);
        return entry != layout.end() && entry->second == kind;
    };
    std::optional<Misfit> misfit;
    if (isMade(CONFIG_SHM_NAME, EntryKind::image)) {
        misfit = findImageMisfit(unit.image);
    }
    if (!misfit && isMade(BOOT_DISK, EntryKind::disk)) {
        misfit = findDiskMisfit(unit.disk);
    }
    for (auto file = unit.sparseFiles.begin(); !misfit && file != unit.sparseFiles.end(); ++file) {
        misfit = findBytesMisfit(
            file->second.bytes, file->second.size, "a file",
            [&path = file->first](std::uint64_t offset) { return fileBytesPart(path, offset); });
    }
    return misfit;
}

std::string paramPart(std::uint64_t number) {
    return "param " + std::to_string(number);
}

std::string imageBytesPart(std::uint64_t offset) {
    return "image " + std::to_string(offset);
}

std::string slotPart(std::uint64_t slot) {
    return "slot " + std::to_string(slot);
}

std::string tuningPart(std::uint64_t blockId) {
    return "tuning " + std::to_string(blockId);
}

std::string diskBytesPart(std::uint64_t offset) {
    return "disk " + std::to_string(offset);
}

std::string fileBytesPart(const std::string& path, std::uint64_t offset) {
    return path + " " + std::to_string(offset);
}

std::uint64_t leastDiskForSlot(std::uint32_t slot) {
    std::uint32_t size = 0;
    std::uint64_t offset = 0;
    recordSlotLayout(slot, size, offset);
    return static_cast<std::uint64_t>(RECORD_AREA_SIZE) - offset;
}

std::uint64_t leastDiskForTuning() {
    return TUNING_AREA_START;
}

std::uint64_t leastDiskForAux() {
    return AUX_AREA_START;
}

std::string tooSmallDisk(const std::string& what, std::uint64_t size, std::uint64_t least) {
    return what + " does not fit on a disk of " + std::to_string(size) + " bytes: it takes " +
           std::to_string(least);
}

std::string pastTheEnd(const std::string& what, std::uint64_t offset, std::uint64_t length,
                       std::uint64_t size, const char* whole) {
    if (offset <= size && length <= size - offset) {
        return {};
    }
    return what + " ends at byte " + std::to_string(offset + length) + " of " + whole + " of " +
           std::to_string(size) + " bytes";
}

ParamPlace paramPlace(std::uint16_t number) {
    std::int32_t index = 0;
    ParamDescriptor row{};
    lookupParam(number, index, row);
    return {row.offset, paramTypeSize(row.type)};
}

} // namespace orvane::kit
