// SPDX-License-Identifier: Apache-2.0
#include "kit/unit/redact_serial.h"

#include "identity/inf_file.h"
#include "identity/software_version.h"
#include "identity/vehicle_identity.h"
#include "kit/description/unit_description.h"
#include "kit/description/unit_layout.h"
#include "kit/description/value_key.h"
#include "kit/description/value_places.h"
#include "kit/host/descriptor.h"
#include "kit/host/host_file.h"
#include "kit/host/kit_error.h"
#include "kit/host/sparse_content.h"
#include "kit/host/text.h"
#include "kit/host/tree_entries.h"

#include <algorithm>
#include <cstddef>
#include <map>
#include <optional>
#include <string>
#include <utility>
#include <vector>

namespace orvane::kit {

namespace {

namespace fs = std::filesystem;

/// A shorter serial occurs by chance in what has nothing to do with it. In bytes.
constexpr std::size_t SHORTEST_SOUGHT = 4;

void cover(Bytes& bytes, std::size_t at, std::size_t length) {
    bytes.replace(at, length, length, 'X');
}

/// Covers every occurrence, overlapping ones whole.
void redact(const Bytes& serial, Bytes& bytes) {
    std::vector<std::size_t> found;
    for (std::size_t at = bytes.find(serial); at != Bytes::npos; at = bytes.find(serial, at + 1)) {
        found.push_back(at);
    }
    for (const std::size_t at : found) {
        cover(bytes, at, serial.size());
    }
    // A serial that has an X of its own may have come about anew.
    std::size_t at = 0;
    while ((at = bytes.find(serial, at)) != Bytes::npos) {
        cover(bytes, at, serial.size());
        at -= std::min(at, serial.size() - 1);
    }
}

/// `path` with the serial covered in its last name.
std::string pathWithoutSerial(const Bytes& serial, const std::string& path) {
    const std::string folder = pathAbove(path);
    return folder + withoutSerial(serial, path.substr(folder.size()));
}

bool isVersionPath(const std::string& path) {
    return pathAbove(path) + "/" == VERSION_DIR && isVersionFile(path);
}

/// Covers the serial in the names of version files.
template <class Files>
void redactNames(const Bytes& serial, Files& files) {
    std::vector<std::string> paths;
    for (const auto& [path, content] : files) {
        paths.push_back(path);
    }
    for (const std::string& path : paths) {
        const std::string redacted = pathWithoutSerial(serial, path);
        if (isVersionPath(path) && isVersionPath(redacted) && files.count(redacted) == 0) {
            auto file = files.extract(path);
            file.key() = redacted;
            files.insert(std::move(file));
        }
    }
}

void redactFiles(const Bytes& serial, UnitDescription& unit) {
    for (auto& [path, content] : unit.files) {
        redact(serial, content);
    }
    for (auto& [path, content] : unit.sparseFiles) {
        for (auto& [offset, bytes] : content.bytes) {
            redact(serial, bytes); // a serial has no zero, so it lies within one run
        }
    }
    for (auto& [path, target] : unit.links) {
        redact(serial, target);
    }
    redactNames(serial, unit.files);
    redactNames(serial, unit.sparseFiles);
    redactNames(serial, unit.links);
    for (std::string& path : unit.folders) {
        if (isVersionPath(path) && isVersionPath(pathWithoutSerial(serial, path))) {
            path = pathWithoutSerial(serial, path);
        }
    }
}

/// Also of an empty one.
bool isRedacted(const Bytes& serial) {
    return serial.find_first_not_of('X') == Bytes::npos;
}

bool holds(const Bytes& serial, const fs::path& file) {
    const Descriptor descriptor = openForReading(file);
    const SparseContent runs = sparseContent(descriptor, file, sizeOf(descriptor, file));
    return std::any_of(runs.begin(), runs.end(), [&serial](const auto& run) {
        return run.second.find(serial) != Bytes::npos;
    });
}

[[noreturn]] void failAt(const std::string& what, const fs::path& path) {
    throw KitError("the serial also stands in " + what + " ", path,
                   ", and can't be replaced there");
}

} // namespace

std::string withoutSerial(const Bytes& serial, std::string text) {
    if (!serial.empty()) {
        redact(serial, text);
    }
    return text;
}

Bytes redactSerial(UnitInputs& inputs) {
    const ValuePlace place = valuePlace(slotKey(SERIAL_RECORD_SLOT));
    if (!inputs.disk || inputs.disk->size() < place.leastSize) {
        return {};
    }
    Bytes& disk = *inputs.disk;
    const auto begin = static_cast<std::size_t>(place.offsetIn(disk.size()));
    const std::size_t size = place.mask.size();
    const Bytes slot = disk.substr(begin, size);
    const Bytes serial = slot.substr(0, slot.find('\0'));
    Bytes sought = trimSpaces(serial);
    const bool isSought = !isRedacted(sought);
    if (isSought && sought.size() < SHORTEST_SOUGHT) {
        throw KitError("a serial of " + counted(sought.size(), "byte") +
                       " can't be redacted: so few bytes also stand in other places by chance");
    }
    if (isSought) {
        redact(sought, disk); // while the slot still shows what overlaps with it
    }
    disk.replace(begin, size, size, '\0');
    cover(disk, begin, serial.size());
    if (!isSought) {
        return {};
    }
    redact(sought, disk);
    if (inputs.image) {
        redact(sought, *inputs.image);
    }
    redactFiles(sought, inputs.unit);
    return sought;
}

void requireNowhere(const Bytes& serial, const fs::path& folder) {
    for (std::vector<fs::path> folders = {folder}; !folders.empty();) {
        const std::vector<fs::directory_entry> entries = listFolder(folders.back());
        folders.pop_back();
        for (const fs::path& entry : entries) {
            if (entry.filename().string().find(serial) != std::string::npos) {
                failAt("the name of", entry);
            }
            const fs::file_type kind = kindOf(entry);
            if (kind == fs::file_type::directory) {
                folders.push_back(entry);
            } else if (kind == fs::file_type::symlink) {
                if (targetOf(entry).find(serial) != std::string::npos) {
                    failAt("the target of", entry);
                }
            } else if (holds(serial, entry)) {
                failAt("the file", entry);
            }
        }
    }
}

} // namespace orvane::kit
