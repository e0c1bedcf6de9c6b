// SPDX-License-Identifier: Apache-2.0
#include "kit/description/unit_layout.h"

#include "config/boot_disk.h"
#include "config/config_store.h"
#include "main/unit_files.h"
#include "writers/template_merge.h"

#include <algorithm>
#include <iterator>
#include <set>
#include <utility>
#include <vector>

namespace orvane::kit {

namespace {

/// The folders that every unit has: those of everything that a run opens.
std::set<std::string> unitFolders() {
    std::set<std::string> folders = {OUTPUT_FOLDER};
    for (const char* source : VALUE_SOURCES) {
        folders.insert(pathAbove(source));
    }
    for (const AccessoryFile& file : ACCESSORY_FILES) {
        folders.insert(pathAbove(file.templateFile));
        folders.insert(pathAbove(file.stockFile));
    }
    return folders;
}

/// Adds the folders above `path` that have no entry yet.
void addFoldersAbove(const std::string& path, Layout& layout) {
    for (std::string above = pathAbove(path); !above.empty(); above = pathAbove(above)) {
        layout.emplace(above, EntryKind::folder);
    }
}

/// Adds an entry unless `path` has one already or lies below a file or link.
void addUnlessTaken(const std::string& path, EntryKind kind, Layout& layout) {
    for (std::string above = pathAbove(path); !above.empty(); above = pathAbove(above)) {
        const auto taken = layout.find(above);
        if (taken != layout.end() && taken->second != EntryKind::folder) {
            return;
        }
    }
    layout.emplace(path, kind);
    addFoldersAbove(path, layout);
}

} // namespace

Layout layoutOf(const UnitDescription& unit) {
    Layout layout;
    for (const auto& [path, content] : unit.files) {
        layout.emplace(path, EntryKind::file);
    }
    for (const auto& [path, content] : unit.sparseFiles) {
        layout.emplace(path, EntryKind::sparseFile);
    }
    for (const auto& [path, target] : unit.links) {
        layout.emplace(path, EntryKind::link);
    }
    for (const std::string& path : unit.folders) {
        layout.emplace(path, EntryKind::folder);
    }
    const Layout named = layout;
    for (const auto& [path, kind] : named) {
        addFoldersAbove(path, layout);
    }
    for (const std::string& folder : unitFolders()) {
        addUnlessTaken(folder, EntryKind::folder, layout);
    }
    addUnlessTaken(CONFIG_SHM_NAME, EntryKind::image, layout);
    addUnlessTaken(BOOT_DISK, EntryKind::disk, layout);
    for (const std::string& absent : unit.absent) {
        for (auto entry = layout.lower_bound(absent); entry != layout.end();) {
            entry = isAtOrBelow(entry->first, absent) ? layout.erase(entry) : std::next(entry);
        }
    }
    return layout;
}

void addAbsent(const Layout& layout,
               const std::function<bool(const std::string& path, EntryKind kind)>& isThere,
               UnitDescription& unit) {
    for (const auto& [path, kind] : layout) {
        const bool isKnown =
            std::any_of(unit.absent.begin(), unit.absent.end(),
                        [&p = path](const std::string& absent) { return isAtOrBelow(p, absent); });
        if (!isKnown && !isThere(path, kind)) {
            unit.absent.push_back(path);
        }
    }
}

std::string pathAbove(const std::string& path) {
    return path.substr(0, path.rfind('/'));
}

bool isAtOrBelow(const std::string& entry, const std::string& ancestor) {
    return entry.compare(0, ancestor.size(), ancestor) == 0 &&
           (entry.size() == ancestor.size() || entry[ancestor.size()] == '/');
}

bool isStandardFolder(const std::string& path) {
    const std::set<std::string> folders = unitFolders();
    return std::any_of(folders.begin(), folders.end(),
                       [&path](const std::string& folder) { return isAtOrBelow(folder, path); });
}

} // namespace orvane::kit
