// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/explain/value_origins.h"

#include "config/boot_disk.h"
#include "config/config_store.h"
#include "config/param_catalogue.h"
#include "config/record_area.h"
#include "config/record_slots.h"
#include "identity/model_names.h"
#include "identity/vehicle_identity.h"
#include "kit/host/text.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <array>
#include <cstddef>

namespace orvane::desk {

namespace {

std::uint64_t diskOffset(std::int64_t bytesBeforeEnd) {
    return diskSize() - static_cast<std::uint64_t>(bytesBeforeEnd);
}

std::string bytesFrom(const char* what, std::uint64_t offset, const std::string& bytes) {
    return std::string(what) + (bytes.size() == 1 ? " byte " : " bytes from ") +
           std::to_string(offset) + ": " + kit::hexText(bytes);
}

} // namespace

std::optional<Reason> diskTrouble(std::int64_t bytesBeforeEnd) {
    const BootDisk disk(O_RDONLY);
    if (!disk.isOpen()) {
        return Reason::diskMissing;
    }
    struct stat state {};
    const bool isFolder = ::stat(BOOT_DISK, &state) == 0 && S_ISDIR(state.st_mode);
    if (!disk.seekFromEnd(bytesBeforeEnd)) {
        // Whether a folder can be sought at all is the file system's business.
        return isFolder ? Reason::diskUnreadable : Reason::diskTooShort;
    }
    char byte = 0;
    return disk.read(&byte, 1) ? std::nullopt : std::optional<Reason>(Reason::diskUnreadable);
}

std::uint64_t diskSize() {
    const int descriptor = ::open(BOOT_DISK, O_RDONLY | O_CLOEXEC);
    if (descriptor < 0) {
        return 0;
    }
    const off_t size = ::lseek(descriptor, 0, SEEK_END); // also of a device
    ::close(descriptor);
    return size < 0 ? 0 : static_cast<std::uint64_t>(size);
}

Image readImage() {
    Image image;
    ConfigStore store;
    store.init();
    const std::int32_t opened = store.open();
    if (opened == 0) {
        image.bytes.assign(reinterpret_cast<const char*>(store.data), store.length);
    } else {
        // What opens and can't be measured, such as a folder, is no memory object either.
        const bool isThere = opened == -1 || store.descriptor != -1;
        image.reason = isThere ? Reason::imageNotMappable : Reason::imageMissing;
    }
    return image;
}

Origin paramOrigin(const Image& image, std::uint16_t number) {
    ParamDescriptor row{};
    std::int32_t index = 0;
    lookupParam(number, index, row);
    const std::uint32_t size = paramTypeSize(row.type);
    const std::string name = "parameter " + std::to_string(number);
    Origin origin{{image.reason}, "param." + std::to_string(number), name};
    if (image.reason != Reason::fromImage) {
        origin.detail += " counts as missing";
        return origin;
    }
    if (row.offset + size > image.bytes.size()) {
        origin.reasons = {Reason::imageTooShort};
        origin.detail += ", image byte " + std::to_string(row.offset) + " of " +
                         std::to_string(image.bytes.size());
        return origin;
    }
    origin.detail += bytesFrom(", image", row.offset, image.bytes.substr(row.offset, size));
    return origin;
}

Origin modelOrigin(const Image& image) {
    Origin origin = paramOrigin(image, MODEL_PARAM);
    if (origin.reasons.front() == Reason::fromImage) {
        ParamDescriptor row{};
        std::int32_t index = 0;
        lookupParam(MODEL_PARAM, index, row);
        const auto code = static_cast<unsigned char>(image.bytes[row.offset]);
        if (code == 0 || code > MODEL_CODE_COUNT) {
            origin.reasons = {Reason::modelUnknown};
        }
    }
    return origin;
}

Origin serialOrigin() {
    const std::string name = "record slot " + std::to_string(SERIAL_RECORD_SLOT);
    Origin origin{{Reason::fromRecord}, "slot." + std::to_string(SERIAL_RECORD_SLOT), name};
    std::uint32_t size = 0;
    std::uint64_t offset = 0;
    recordSlotLayout(SERIAL_RECORD_SLOT, size, offset);
    const std::int64_t bytesBeforeEnd = RECORD_AREA_SIZE - static_cast<std::int64_t>(offset);
    if (const std::optional<Reason> trouble = diskTrouble(bytesBeforeEnd)) {
        origin.reasons = {*trouble};
        return origin;
    }
    std::string record(size, '\0');
    readRecordSlot(SERIAL_RECORD_SLOT, record.data(), size);
    if (record.front() == '\0') {
        origin.reasons = {Reason::serialBlank};
    }
    origin.detail += bytesFrom(", disk", diskOffset(bytesBeforeEnd), record);
    return origin;
}

TuningArea readTuningBlocks() {
    TuningArea area;
    if (const std::optional<Reason> trouble = diskTrouble(TUNING_AREA_START)) {
        area.reason = *trouble;
        return area;
    }
    area.offset = diskOffset(TUNING_AREA_START);
    readTuningArea(area.blocks.data(), DPS_AREA_SIZE);
    return area;
}

Origin fieldOrigin(const TuningArea& area, std::int32_t blockId, const DpsField& field) {
    const std::string block = std::to_string(blockId);
    Origin origin{{area.reason}, "tuning." + block + "." + field.key, "block " + block};
    if (area.reason != Reason::fromTuningBlock) {
        origin.detail += " counts as zeros";
        return origin;
    }
    const DpsBlock& bytes = area.blocks.at(static_cast<std::size_t>(blockId));
    if ((field.kind == DpsKind::switchWord &&
         *qwaWord(qwaSwitchWords, decodeField(bytes, field, 0)) == '\0') ||
        (field.kind == DpsKind::modeWord &&
         *qwaWord(qwaModeWords, decodeField(bytes, field, 0)) == '\0')) {
        origin.reasons = {Reason::wordUnknown};
    }
    const std::size_t length = dpsElementSize(field.encoding) * field.count;
    const std::string raw(reinterpret_cast<const char*>(bytes.bytes.data()) + field.offset, length);
    const std::uint64_t start =
        area.offset + static_cast<std::uint64_t>(blockId) * DPS_BLOCK_SIZE + field.offset;
    origin.detail += bytesFrom(", disk", start, raw);
    if (field.encoding == DpsEncoding::code2) {
        origin.detail +=
            ", bits " + std::to_string(field.bit) + " and " + std::to_string(field.bit + 1);
    }
    return origin;
}

} // namespace orvane::desk
