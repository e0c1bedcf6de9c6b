// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/explain/value_origins.h"

#include "config/boot_disk.h"
#include "config/config_store.h"
#include "config/param_catalogue.h"
#include "config/record_area.h"
#include "config/record_slots.h"
#include "identity/model_names.h"
#include "identity/vehicle_identity.h"
#include "kit/description/value_key.h"
#include "kit/description/value_places.h"
#include "kit/host/input_kind.h"
#include "orvane_unit/explain/place.h"
#include "tuning/tuning_file.h"

#include <fcntl.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cstddef>
#include <variant>
#include <vector>

namespace orvane::desk {

namespace {

/// Of a place at which the disk can be read.
std::uint64_t diskOffset(std::int64_t bytesBeforeEnd) {
    return diskSize() - static_cast<std::uint64_t>(bytesBeforeEnd);
}

/// The bytes of a value in an image; none when the image ends before them.
std::optional<std::string> imageBytes(const Image& image, const kit::ParamPlace& place) {
    return place.offset + place.size <= image.bytes.size()
               ? std::optional<std::string>(image.bytes.substr(place.offset, place.size))
               : std::nullopt;
}

} // namespace

std::optional<Reason> diskTrouble(std::int64_t bytesBeforeEnd) {
    const kit::InputKind kind = kit::lookAtPositionedInput(BOOT_DISK);
    const BootDisk disk(O_RDONLY);
    if (!disk.isOpen()) {
        return Reason::diskMissing;
    }
    if (!disk.seekFromEnd(bytesBeforeEnd)) {
        // Whether a seek in a folder works depends on the file system.
        return kind == kit::InputKind::folder ? Reason::diskUnreadable : Reason::diskTooShort;
    }
    char byte = 0;
    return disk.read(&byte, 1) ? std::nullopt : std::optional<Reason>(Reason::diskUnreadable);
}

std::uint64_t diskSize() {
    kit::lookAtPositionedInput(BOOT_DISK);
    const int descriptor = ::open(BOOT_DISK, O_RDONLY | O_CLOEXEC);
    if (descriptor < 0) {
        return 0;
    }
    const off_t size = ::lseek(descriptor, 0, SEEK_END); // also of a device
    ::close(descriptor);
    return size < 0 ? 0 : static_cast<std::uint64_t>(size);
}

Image readImage() {
    kit::lookAtMappedInput(CONFIG_SHM_NAME);
    Image image;
    ConfigStore store;
    store.init();
    const std::int32_t opened = store.open();
    if (opened == STORE_OPENED) {
        // store.length has 32 bits, and no getter consults it.
        image.size = static_cast<std::uint64_t>(::lseek(store.descriptor, 0, SEEK_END));
        const auto length = std::min<std::uint64_t>(image.size, CONFIG_IMAGE_SIZE);
        image.bytes.assign(reinterpret_cast<const char*>(store.data),
                           static_cast<std::size_t>(length));
    } else {
        // What opens and can't be measured, such as a folder, is not a memory object either.
        const bool isThere = opened == STORE_NOT_MAPPED || store.descriptor != -1;
        image.reason = isThere ? Reason::imageNotMappable : Reason::imageMissing;
    }
    return image;
}

Origin paramOrigin(const Image& image, std::uint16_t number) {
    Origin origin{{image.reason}, kit::paramKey(number), DefaultStandsIn()};
    if (image.reason != Reason::fromImage) {
        return origin;
    }
    const kit::ParamPlace place = kit::paramPlace(number);
    if (const std::optional<std::string> bytes = imageBytes(image, place)) {
        origin.place = ImagePlace{place.offset, *bytes};
    } else {
        origin.reasons = {Reason::imageTooShort};
        origin.place = BehindImage{place.offset, image.size};
    }
    return origin;
}

Origin modelOrigin(const Image& image) {
    Origin origin = paramOrigin(image, MODEL_PARAM);
    const auto* place = std::get_if<ImagePlace>(&origin.place);
    if (place != nullptr && !hasModelName(static_cast<std::uint8_t>(place->bytes.front()))) {
        origin.reasons = {Reason::modelUnknown};
    }
    return origin;
}

Origin serialOrigin() {
    Origin origin{{Reason::fromRecord}, kit::slotKey(SERIAL_RECORD_SLOT), NoPlace()};
    const kit::SlotPlace slot = kit::slotPlace(SERIAL_RECORD_SLOT);
    const std::int64_t bytesBeforeEnd = RECORD_AREA_SIZE - static_cast<std::int64_t>(slot.offset);
    if (const std::optional<Reason> trouble = diskTrouble(bytesBeforeEnd)) {
        origin.reasons = {*trouble};
        return origin;
    }
    std::string record(slot.size, '\0');
    readRecordSlot(SERIAL_RECORD_SLOT, record.data(), slot.size);
    std::string serial;
    getUnitSerial(serial);
    if (serial.empty()) {
        origin.reasons = {Reason::serialBlank};
    }
    origin.place = DiskPlace{diskOffset(bytesBeforeEnd), record, {}};
    return origin;
}

TuningArea readUnitTuning() {
    TuningArea area;
    if (const std::optional<Reason> trouble = diskTrouble(TUNING_AREA_START)) {
        area.reason = *trouble;
    } else {
        area.offset = diskOffset(TUNING_AREA_START);
    }
    area.blocks = readTuningBlocks();
    return area;
}

Origin fieldOrigin(const TuningArea& area, std::int32_t blockId, const DpsField& field) {
    const auto id = static_cast<std::size_t>(blockId);
    Origin origin{{area.reason}, kit::tuningFieldKey(id, field.key), DefaultStandsIn()};
    if (area.reason != Reason::fromTuningBlock) {
        return origin;
    }
    const DpsBlock& block = area.blocks.at(id);
    const bool isWord = field.kind == DpsKind::switchWord || field.kind == DpsKind::modeWord;
    if (isWord && *fieldWord(field, decodeField(block, field, 0)) == '\0') {
        origin.reasons = {Reason::wordUnknown};
    }
    const std::size_t length = dpsElementSize(field.encoding) * field.count;
    DiskPlace place;
    place.offset = area.offset + id * DPS_BLOCK_SIZE + field.offset;
    place.bytes.assign(block.bytes.begin() + field.offset,
                       block.bytes.begin() + field.offset + static_cast<std::ptrdiff_t>(length));
    if (field.encoding == DpsEncoding::code2) {
        place.lowerBit = field.bit;
    }
    origin.place = place;
    return origin;
}

} // namespace orvane::desk
