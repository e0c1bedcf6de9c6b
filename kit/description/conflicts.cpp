// SPDX-License-Identifier: Apache-2.0
#include "kit/description/conflicts.h"

#include "config/boot_disk.h"
#include "config/config_store.h"
#include "kit/description/value_places.h"

#include <cstdint>
#include <map>
#include <utility>
#include <vector>

namespace orvane::kit {

namespace {

/// Finds two entries at one path, and entries below anything that is not a folder.
class PathCheck {
public:
    std::optional<Conflict> conflict;

    /// `key` is the key of a file, link or folder.
    void enter(const ValueKey& key) {
        const std::string& path = key.name;
        const auto [entry, isNew] = entries_.emplace(path, key);
        const bool isFolderAgain = entry->second == key && isFolder(key);
        if (!isNew && !isFolderAgain && !conflict) {
            const std::string one = nounOf(entry->second);
            const std::string other = nounOf(key);
            std::string what = path;
            what += one == other ? " is given twice" : " is both " + one + " and " + other;
            conflict = {key, what};
        }
    }

    void findBelow() {
        for (const auto& [path, key] : entries_) {
            for (std::string above = pathAbove(path); !above.empty(); above = pathAbove(above)) {
                const auto taken = entries_.find(above);
                if (!conflict && taken != entries_.end() && !isFolder(taken->second)) {
                    std::string what = path;
                    what += " lies below " + above;
                    what.append(", which is ").append(nounOf(taken->second));
                    conflict = {key, what + ", not a folder"};
                }
            }
        }
    }

private:
    static bool isFolder(const ValueKey& key) { return key.kind == ValueKey::Kind::folder; }
    static const char* nounOf(const ValueKey& key) {
        return isFolder(key) ? "a folder" : key.kind == ValueKey::Kind::link ? "a link" : "a file";
    }

    std::map<std::string, ValueKey> entries_; ///< by path
};

std::optional<Conflict> findPlaceConflict(const ValueKey& key, std::uint64_t size) {
    const std::string what = placeFault(key, size);
    return what.empty() ? std::nullopt : std::optional<Conflict>({key, what});
}

/// `keyOf` gives the key of the bytes at an offset.
template <class Map, class KeyOf>
std::optional<Conflict> findBytesConflict(const Map& bytes, std::uint64_t size, const char* whole,
                                          const KeyOf& keyOf) {
    for (const auto& [offset, content] : bytes) {
        const ValueKey key = keyOf(offset);
        const std::string what = pastTheEnd(valueName(key), offset, content.size(), size, whole);
        if (!what.empty()) {
            return Conflict{key, what};
        }
    }
    return {};
}

std::optional<Conflict> findImageConflict(const ImageDescription& image) {
    for (const auto& [number, value] : image.params) {
        if (auto conflict = findPlaceConflict(paramKey(number), image.size)) {
            return conflict;
        }
    }
    return findBytesConflict(image.bytes, image.size, "an image", imageBytesKey);
}

std::optional<Conflict> findDiskConflict(const DiskDescription& disk) {
    std::vector<ValueKey> keys;
    for (const auto& [slot, bytes] : disk.slots) {
        keys.push_back(slotKey(slot));
    }
    if (disk.aux) {
        keys.push_back(auxKey());
    }
    for (const auto& [block, content] : disk.tuning) {
        keys.push_back(tuningBlockKey(block));
    }
    for (const ValueKey& key : keys) {
        if (auto conflict = findPlaceConflict(key, disk.size)) {
            return conflict;
        }
    }
    return findBytesConflict(disk.bytes, disk.size, "a disk", diskBytesKey);
}

} // namespace

std::optional<Conflict> findPathConflict(const UnitDescription& unit) {
    PathCheck check;
    for (const auto& [path, content] : unit.files) {
        check.enter(fileKey(path));
    }
    for (const auto& [path, content] : unit.sparseFiles) {
        check.enter(fileKey(path));
    }
    for (const auto& [path, target] : unit.links) {
        check.enter(linkKey(path));
    }
    for (const std::string& path : unit.folders) {
        check.enter(folderKey(path));
    }
    check.findBelow();
    return check.conflict;
}

std::optional<Conflict> findSizeConflict(const UnitDescription& unit, const Layout& layout) {
    const auto isMade = [&layout](const char* path, EntryKind kind) {
        const auto entry = layout.find(path);
        return entry != layout.end() && entry->second == kind;
    };
    std::optional<Conflict> conflict;
    if (isMade(CONFIG_SHM_NAME, EntryKind::image)) {
        conflict = findImageConflict(unit.image);
    }
    if (!conflict && isMade(BOOT_DISK, EntryKind::disk)) {
        conflict = findDiskConflict(unit.disk);
    }
    for (auto file = unit.sparseFiles.begin(); !conflict && file != unit.sparseFiles.end();
         ++file) {
        conflict = findBytesConflict(
            file->second.bytes, file->second.size, "a file",
            [&path = file->first](std::uint64_t offset) { return fileBytesKey(path, offset); });
    }
    return conflict;
}

} // namespace orvane::kit
