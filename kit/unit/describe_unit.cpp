// SPDX-License-Identifier: Apache-2.0
#include "kit/unit/describe_unit.h"

#include "config/boot_disk.h"
#include "config/config_store.h"
#include "kit/description/unit_layout.h"
#include "kit/host/host_file.h"
#include "kit/host/kit_error.h"
#include "kit/host/tree_entries.h"
#include "kit/unit/marker.h"

#include <algorithm>
#include <map>
#include <string>
#include <utility>
#include <vector>

namespace orvane::kit {

namespace {

namespace fs = std::filesystem;

class UnitReader {
public:
    explicit UnitReader(fs::path root) : root_(std::move(root)) {}

    UnitDescription read() {
        for (pending_ = {""}; !pending_.empty();) {
            const std::string path = std::move(pending_.back());
            pending_.pop_back();
            readFolder(path);
        }
        std::sort(there_.begin(), there_.end());
        std::sort(unit_.folders.begin(), unit_.folders.end());
        // What every unit has and this one lacks.
        addAbsent(
            layoutOf(unit_),
            [this](const std::string& path, EntryKind /*kind*/) {
                return std::binary_search(there_.begin(), there_.end(), path);
            },
            unit_);
        return std::move(unit_);
    }

private:
    /// `path` is a folder of the unit, empty for the top.
    void readFolder(const std::string& path) {
        const auto entries = listFolder(root_ / fs::path(path).relative_path());
        for (const fs::directory_entry& entry : entries) {
            const std::string name = entry.path().filename().string();
            if (!path.empty() || name != MARKER_NAME) {
                readEntry(std::string(path).append("/").append(name), entry);
            }
        }
        if (entries.empty() && !isStandardFolder(path)) {
            unit_.folders.push_back(path);
        }
    }

    void readEntry(const std::string& path, const fs::directory_entry& entry) {
        there_.push_back(path);
        const fs::file_type kind = kindOf(entry.path());
        if (kind == fs::file_type::directory) {
            pending_.push_back(path);
        } else if (kind == fs::file_type::symlink) {
            unit_.links.emplace(path, targetOf(entry.path()));
        } else if (kind == fs::file_type::regular) {
            readFile(path, entry.path());
        } else {
            throw KitError("", entry.path(),
                           " is " + nounOf(kind) + ", not a file, a folder or a link");
        }
    }

    void readFile(const std::string& path, const fs::path& file) {
        const Descriptor descriptor = openForReading(file);
        const std::uint64_t size = sizeOf(descriptor, file);
        if (path == CONFIG_SHM_NAME && size <= LONGEST_IMAGE) {
            unit_.image = describeImage(readAt(descriptor, file, 0, size));
        } else if (path == BOOT_DISK) {
            unit_.disk = describeDisk(descriptor, file, size);
        } else {
            describeFile(descriptor, file, path, unit_);
        }
    }

    fs::path root_;
    UnitDescription unit_;
    std::vector<std::string> there_;   ///< all paths
    std::vector<std::string> pending_; ///< folders still to be read
};

} // namespace

UnitDescription describeUnit(const fs::path& root) {
    requireKitUnit(root);
    return UnitReader(root).read();
}

} // namespace orvane::kit
