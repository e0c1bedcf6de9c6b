// SPDX-License-Identifier: Apache-2.0
#include "kit/unit/make_unit.h"

#include "kit/description/conflicts.h"
#include "kit/description/unit_checks.h"
#include "kit/description/unit_description.h"
#include "kit/description/unit_layout.h"
#include "kit/description/value_key.h"
#include "kit/description/value_places.h"
#include "kit/host/bytes.h"
#include "kit/host/descriptor.h"
#include "kit/host/finished_folder.h"
#include "kit/host/host_file.h"
#include "kit/host/interruption.h"
#include "kit/host/kit_error.h"
#include "kit/host/little_endian.h"
#include "kit/tuning/tuning_encode.h"
#include "kit/unit/marker.h"
#include "tuning/dps_block.h"

#include <array>
#include <map>
#include <optional>
#include <string>

namespace orvane::kit {

namespace {

namespace fs = std::filesystem;

void makeImage(const ImageDescription& image, const fs::path& file) {
    const Descriptor descriptor = makeSparseFile(file, image.size);
    for (const auto& [number, value] : image.params) {
        const ParamPlace place = paramPlace(number);
        writeAt(descriptor, file, place.offset, littleEndian(value, place.size));
    }
    for (const auto& [offset, bytes] : image.bytes) {
        writeAt(descriptor, file, offset, bytes);
    }
}

void makeDisk(const DiskDescription& disk, const fs::path& file) {
    const Descriptor descriptor = makeSparseFile(file, disk.size);
    const auto write = [&](const ValueKey& key, Bytes bytes) {
        const ValuePlace place = valuePlace(key);
        bytes.resize(place.mask.size()); // padded with zeros
        writeAt(descriptor, file, place.offsetIn(disk.size), bytes);
    };
    for (const auto& [slot, bytes] : disk.slots) {
        write(slotKey(slot), bytes);
    }
    if (disk.aux) {
        write(auxKey(), *disk.aux);
    }
    for (const auto& [id, description] : disk.tuning) {
        const DpsBlock block = encodeTuningBlock(description);
        write(tuningBlockKey(id), Bytes(block.bytes.begin(), block.bytes.end()));
    }
    for (const auto& [offset, bytes] : disk.bytes) {
        writeAt(descriptor, file, offset, bytes);
    }
}

void makeSparse(const SparseFile& content, const fs::path& file) {
    const Descriptor descriptor = makeSparseFile(file, content.size);
    for (const auto& [offset, bytes] : content.bytes) {
        writeAt(descriptor, file, offset, bytes);
    }
}

/// Makes one entry. Requires that the path is free and the folder above exists.
void makeEntry(const UnitDescription& unit, const std::string& path, EntryKind kind,
               const fs::path& root) {
    const fs::path place = root / fs::path(path).relative_path();
    switch (kind) {
    case EntryKind::folder:
        fs::create_directory(place);
        break;
    case EntryKind::file:
        writeAt(makeSparseFile(place, 0), place, 0, unit.files.at(path));
        break;
    case EntryKind::sparseFile:
        makeSparse(unit.sparseFiles.at(path), place);
        break;
    case EntryKind::link:
        fs::create_symlink(unit.links.at(path), place);
        break;
    case EntryKind::image:
        makeImage(unit.image, place);
        break;
    case EntryKind::disk:
        makeDisk(unit.disk, place);
        break;
    }
}

void throwIfAny(const std::optional<Conflict>& conflict) {
    if (conflict) {
        throw KitError(conflict->what);
    }
}

} // namespace

void makeUnit(const UnitDescription& unit, const fs::path& root) {
    makeUnit(unit, root, [](const fs::path& /*folder*/) {});
}

void makeUnit(const UnitDescription& unit, const fs::path& root,
              const std::function<void(const fs::path&)>& inspect) {
    checkUnit(unit);
    throwIfAny(findPathConflict(unit));
    const Layout layout = layoutOf(unit);
    throwIfAny(findSizeConflict(unit, layout));
    makeFinishedFolder(root, MARKER_NAME, [&](const fs::path& folder) {
        for (const auto& [path, kind] : layout) {
            throwIfInterrupted();
            makeEntry(unit, path, kind, folder);
        }
        markUnit(folder);
        inspect(folder);
    });
}

} // namespace orvane::kit
