// SPDX-License-Identifier: Apache-2.0
#include "kit/unit/edit.h"

#include "config/boot_disk.h"
#include "config/config_store.h"
#include "kit/description/value_places.h"
#include "kit/enter/entered_root.h"
#include "kit/host/bytes.h"
#include "kit/host/changed_file.h"
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
void checkPlace(const Assignment& assignment) {
    std::string fault;
    try {
        fault = placeFault(assignment.key, fileOf(valuePlace(assignment.key)).size());
    } catch (const KitError& error) {
        fault = error.what();
    }
    if (!fault.empty()) {
        throw KitError(assignment.text + ": " + fault);
    }
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

} // namespace

void setValues(const std::filesystem::path& root, const std::vector<std::string>& assignments) {
    requireKitUnit(root);
    std::vector<Assignment> edits;
    for (const std::string& text : assignments) {
        edits.push_back(readAssignment(text));
    }
    requireDistinct(edits);
    const EnteredRoot entered(root);
    for (const Assignment& edit : edits) {
        checkPlace(edit);
    }
    for (const Assignment& edit : edits) {
        set(edit);
    }
}

} // namespace orvane::kit
