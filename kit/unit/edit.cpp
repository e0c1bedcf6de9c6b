// SPDX-License-Identifier: Apache-2.0
#include "kit/unit/edit.h"

#include "config/boot_disk.h"
#include "config/config_store.h"
#include "kit/description/value_places.h"
#include "kit/enter/entered_root.h"
#include "kit/host/bytes.h"
#include "kit/host/changed_file.h"
#include "kit/host/folder_lock.h"
#include "kit/host/interruption.h"
#include "kit/host/kit_error.h"
#include "kit/unit/edit_assignment.h"
#include "kit/unit/marker.h"

#include <cstddef>
#include <cstdint>

namespace orvane::kit {

namespace {

/// The file that holds `place`, in a process that has entered the unit: links are followed there.
ChangedFile fileOf(const ValuePlace& place) {
    return ChangedFile(place.isOnDisk ? BOOT_DISK : CONFIG_SHM_NAME);
}

/// Throws for a value that the unit has no place for.
void requirePlace(const Assignment& assignment) {
    const std::string fault = placeFault(assignment.key, fileOf(valuePlace(assignment.key)).size());
    if (!fault.empty()) {
        throw KitError(fault);
    }
}

/// Throws for a value that the host's disk has no room for.
void requireRoom(const Assignment& assignment) {
    const ValuePlace place = valuePlace(assignment.key);
    const ChangedFile file = fileOf(place);
    file.reserve(place.offsetIn(file.size()), place.mask.size());
}

/// Sets the bits of the value and no other.
void set(const Assignment& assignment) {
    const ValuePlace place = valuePlace(assignment.key);
    const ChangedFile file = fileOf(place);
    const std::uint64_t offset = place.offsetIn(file.size());
    Bytes bytes = file.read(offset, place.mask.size());
    bytes.resize(place.mask.size());
    for (std::size_t i = 0; i < bytes.size(); ++i) {
        const auto mask = static_cast<unsigned char>(place.mask[i]);
        const auto before = static_cast<unsigned char>(bytes[i]);
        const auto after = static_cast<unsigned char>(assignment.bytes[i]);
        bytes[i] = static_cast<char>((before & ~mask) | (after & mask));
    }
    file.write(offset, bytes);
}

/// `step` for each assignment. Throws KitError with the assignment in front when that fails.
void forEach(const std::vector<Assignment>& assignments, void (*step)(const Assignment&)) {
    for (const Assignment& assignment : assignments) {
        try {
            step(assignment);
        } catch (const KitError& error) {
            throw KitError(assignment.text + ": " + error.text());
        }
    }
}

/// "nothing has been set", or what has.
std::string done(const std::vector<Assignment>& assignments, std::size_t count) {
    std::string texts;
    for (std::size_t i = 0; i < count; ++i) {
        texts += (i == 0 ? "" : ", ") + assignments[i].text;
    }
    return count == 0 ? "nothing has been set" : "only this has been set: " + texts;
}

/// Carries out what has been checked.
void setAll(const std::vector<Assignment>& assignments) {
    const DeferredInterruption deferred;
    for (std::size_t i = 0; i < assignments.size(); ++i) {
        try {
            set(assignments[i]);
        } catch (const KitError& error) {
            throw KitError(assignments[i].text + ": " + error.text() + "; " + done(assignments, i));
        }
    }
}

} // namespace

void setValues(const std::filesystem::path& root, const std::vector<std::string>& assignments) {
    requireKitUnit(root);
    std::vector<Assignment> edits;
    for (const std::string& text : assignments) {
        edits.push_back(readAssignment(text));
    }
    requireDistinct(edits);
    const FolderLock lock(root);
    const EnteredRoot entered(root);
    forEach(edits, requirePlace);
    forEach(edits, requireRoom);
    setAll(edits);
}

} // namespace orvane::kit
