// SPDX-License-Identifier: Apache-2.0
#include "kit/unit/edit.h"

#include "config/boot_disk.h"
#include "config/config_store.h"
#include "config/record_area.h"
#include "config/record_slots.h"
#include "kit/description/conflicts.h"
#include "kit/enter/root.h"
#include "kit/host/bytes.h"
#include "kit/host/descriptor.h"
#include "kit/host/host_file.h"
#include "kit/host/kit_error.h"
#include "kit/tuning/tuning_encode.h"
#include "kit/unit/edit_assignment.h"
#include "kit/unit/marker.h"
#include "tuning/dps_block.h"

#include <fcntl.h>
#include <sys/stat.h>

#include <array>
#include <cstddef>
#include <cstdint>
#include <variant>

namespace orvane::kit {

namespace {

/// A regular file of the unit that is to be changed, links within the unit followed.
class ChangedFile {
public:
    explicit ChangedFile(const char* path)
        : descriptor_(::open(path, O_RDWR | O_NONBLOCK | O_CLOEXEC)), path_(path) {
        if (!descriptor_.isOpen()) {
            throw systemError(std::string("cannot change ") + path);
        }
        struct stat state {};
        if (::fstat(descriptor_.number(), &state) != 0 || !S_ISREG(state.st_mode)) {
            throw KitError(path_ + " is not a regular file");
        }
    }

    std::uint64_t size() const { return sizeOf(descriptor_, path_); }
    void put(std::uint64_t offset, const Bytes& bytes) const {
        writeAt(descriptor_, path_, offset, bytes);
    }

private:
    Descriptor descriptor_;
    std::string path_;
};

void throwIfAny(const std::string& what) {
    if (!what.empty()) {
        throw KitError(what);
    }
}

void checkDisk(const std::string& what, std::uint64_t least) {
    const std::uint64_t size = ChangedFile(BOOT_DISK).size();
    throwIfAny(size < least ? tooSmallDisk(what, size, least) : "");
}

/// Throws for what the unit has no place for.
struct CheckEdit {
    void operator()(const ParamEdit& edit) const {
        const ParamPlace place = paramPlace(edit.number);
        throwIfAny(pastTheEnd("parameter " + std::to_string(edit.number), place.offset, place.size,
                              ChangedFile(CONFIG_SHM_NAME).size(), "an image"));
    }
    void operator()(const SlotEdit& edit) const {
        checkDisk("slot " + std::to_string(edit.slot), leastDiskForSlot(edit.slot));
    }
    void operator()(const AuxEdit& /*edit*/) const {
        checkDisk("the auxiliary area", leastDiskForAux());
    }
    void operator()(const FieldEdit& /*edit*/) const {
        checkDisk("the tuning area", leastDiskForTuning());
    }
    void operator()(const BlockEdit& /*edit*/) const {
        checkDisk("the tuning area", leastDiskForTuning());
    }
};

void expectDone(std::int32_t result) {
    if (result != 0) {
        throw systemError(std::string("cannot change ") + BOOT_DISK);
    }
}

/// Changes tuning block `blockId` on the disk by `change`.
template <class Change>
void changeBlock(std::uint32_t blockId, const Change& change) {
    DpsArea area{};
    expectDone(readTuningArea(area.data(), DPS_AREA_SIZE));
    change(area.at(blockId));
    expectDone(writeTuningArea(area.data(), DPS_AREA_SIZE));
}

struct DoEdit {
    void operator()(const ParamEdit& edit) const {
        const ParamPlace place = paramPlace(edit.number);
        Bytes bytes;
        for (std::uint32_t i = 0; i < place.size; ++i) {
            bytes += static_cast<char>(edit.value >> (8 * i) & 0xFF); // low byte first
        }
        ChangedFile(CONFIG_SHM_NAME).put(place.offset, bytes);
    }
    void operator()(const SlotEdit& edit) const {
        expectDone(writeRecordSlot(edit.slot, edit.bytes.data(),
                                   static_cast<std::uint32_t>(edit.bytes.size())));
    }
    void operator()(const AuxEdit& edit) const {
        Bytes whole = edit.bytes;
        whole.resize(AUX_AREA_SIZE);
        expectDone(writeAuxArea(whole.data(), AUX_AREA_SIZE));
    }
    void operator()(const FieldEdit& edit) const {
        changeBlock(edit.blockId,
                    [&edit](DpsBlock& block) { encodeTuningField(block, edit.key, edit.value); });
    }
    void operator()(const BlockEdit& edit) const {
        changeBlock(edit.blockId, [&edit](DpsBlock& block) {
            block = withoutFields(block);
            for (std::size_t at = 0; at < DPS_BLOCK_SIZE; ++at) {
                block.bytes[at] |= edit.block.bytes[at];
            }
        });
    }
};

} // namespace

void setValues(const std::filesystem::path& root, const std::vector<std::string>& assignments) {
    requireKitUnit(root);
    std::vector<Assignment> edits;
    for (const std::string& text : assignments) {
        edits.push_back(readAssignment(text));
    }
    requireDistinct(edits);
    const EnteredRoot entered(root);
    for (const Assignment& assignment : edits) {
        try {
            std::visit(CheckEdit(), assignment.edit);
        } catch (const KitError& error) {
            throw KitError(assignment.text + ": " + error.what());
        }
    }
    for (const Assignment& assignment : edits) {
        std::visit(DoEdit(), assignment.edit);
    }
}

} // namespace orvane::kit
