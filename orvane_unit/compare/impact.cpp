// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/compare/impact.h"

#include "config/boot_disk.h"
#include "config/config_store.h"
#include "config/param_catalogue.h"
#include "config/record_slots.h"
#include "kit/enter/entered_root.h"
#include "kit/host/descriptor.h"
#include "kit/host/kit_error.h"
#include "kit/host/scratch_folder.h"
#include "kit/unit/describe_inputs.h"
#include "kit/unit/make_unit.h"
#include "orvane_unit/compare/output_differences.h"
#include "orvane_unit/compare/text_diff.h"
#include "orvane_unit/explain/explain.h"
#include "orvane_unit/explain/explanation.h"
#include "orvane_unit/show/decoded_unit.h"
#include "tuning/dps_block.h"

#include <fcntl.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cstdint>
#include <functional>
#include <system_error>
#include <utility>

namespace orvane::desk {

namespace {

namespace fs = std::filesystem;

/// One input: a place in a file of the copy, and the values to try there.
struct Input {
    std::string key;
    bool isOnDisk = false;
    std::uint64_t offset = 0; ///< bytes
    std::string original;
    std::vector<std::string> values;
};

/// A file of the copy that is open for changes; closed when it is no regular file there.
class ChangedFile {
public:
    explicit ChangedFile(const fs::path& path) {
        std::error_code error;
        if (fs::is_regular_file(fs::symlink_status(path, error))) {
            descriptor_ = kit::Descriptor(::open(path.c_str(), O_RDWR | O_CLOEXEC));
            size_ = fs::file_size(path, error);
        }
    }
    bool holds(std::uint64_t offset, std::uint64_t length) const {
        return descriptor_.isOpen() && offset + length <= size_;
    }
    std::uint64_t size() const { return size_; }
    std::string read(std::uint64_t offset, std::size_t length) const {
        std::string bytes(length, '\0');
        if (::pread(descriptor_.number(), bytes.data(), length, static_cast<off_t>(offset)) !=
            static_cast<ssize_t>(length)) {
            throw kit::systemError("cannot read the copy of the unit");
        }
        return bytes;
    }
    void write(std::uint64_t offset, const std::string& bytes) const {
        if (::pwrite(descriptor_.number(), bytes.data(), bytes.size(),
                     static_cast<off_t>(offset)) != static_cast<ssize_t>(bytes.size())) {
            throw kit::systemError("cannot write the copy of the unit");
        }
    }

private:
    kit::Descriptor descriptor_;
    std::uint64_t size_ = 0;
};

std::string littleEndian(std::uint32_t value, std::size_t size) {
    std::string bytes;
    for (std::size_t i = 0; i < size; ++i) {
        bytes += static_cast<char>(value >> (8 * i) & 0xFFU);
    }
    return bytes;
}

/// Other values than `original`: each of its bits turned over, the small codes, the ends of its
/// range and of the tables. For an element of a tuning field, which can only be a code or a number,
/// fewer do.
std::vector<std::string> otherValues(const std::string& original, bool isElement = false) {
    const std::vector<std::uint32_t> codes =
        isElement ? std::vector<std::uint32_t>{0, 1, 2, 3, 0xFFFF}
                  : std::vector<std::uint32_t>{0, 1, 2, 3, 4, 47, 48, 255, 256, 0xFFFE, 0xFFFF};
    std::vector<std::string> values;
    std::uint32_t number = 0;
    for (std::size_t i = 0; i < original.size(); ++i) {
        number |= static_cast<std::uint32_t>(static_cast<unsigned char>(original[i])) << (8 * i);
    }
    const auto add = [&](std::uint32_t value) {
        const std::string bytes = littleEndian(value, original.size());
        if (bytes != original && std::find(values.begin(), values.end(), bytes) == values.end()) {
            values.push_back(bytes);
        }
    };
    for (std::size_t bit = 0; !isElement && bit < 8 * original.size(); ++bit) {
        add(number ^ 1U << bit);
    }
    for (const std::uint32_t code : codes) {
        add(code);
    }
    return values;
}

void addParams(std::vector<Input>& inputs, const ChangedFile& image) {
    for (std::uint16_t number = 1; number <= PARAM_COUNT; ++number) {
        ParamDescriptor row{};
        std::int32_t index = 0;
        lookupParam(number, index, row);
        const std::uint32_t size = paramTypeSize(row.type);
        if (image.holds(row.offset, size)) {
            const std::string original = image.read(row.offset, size);
            inputs.push_back({"param." + std::to_string(number), false, row.offset, original,
                              otherValues(original)});
        }
    }
}

void addSlots(std::vector<Input>& inputs, const ChangedFile& disk) {
    for (std::uint32_t slot = 0; slot < RECORD_SLOT_COUNT; ++slot) {
        std::uint32_t size = 0;
        std::uint64_t offset = 0;
        recordSlotLayout(slot, size, offset);
        if (slot == CRC_RECORD_SLOT || disk.size() < RECORD_AREA_SIZE) {
            continue;
        }
        offset += disk.size() - RECORD_AREA_SIZE;
        for (std::uint32_t byte = 0; byte < size; ++byte) {
            const std::string original = disk.read(offset + byte, 1);
            inputs.push_back({"slot." + std::to_string(slot) + "." + std::to_string(byte), true,
                              offset + byte, original, otherValues(original)});
        }
    }
}

/// The field's bytes with each of its elements changed in turn.
std::vector<std::string> otherFieldValues(const DpsField& field, const std::string& original) {
    std::vector<std::string> values;
    if (field.encoding == DpsEncoding::code2) {
        for (unsigned code = 1; code < 4; ++code) {
            const auto byte = static_cast<unsigned char>(original[0]);
            values.push_back(littleEndian(byte ^ code << field.bit, 1));
        }
        return values;
    }
    const std::size_t size = dpsElementSize(field.encoding);
    for (std::size_t at = 0; at < original.size(); at += size) {
        for (const std::string& value : otherValues(original.substr(at, size), true)) {
            values.push_back(std::string(original).replace(at, size, value));
        }
    }
    return values;
}

void addTuning(std::vector<Input>& inputs, const ChangedFile& disk) {
    if (disk.size() < static_cast<std::uint64_t>(TUNING_AREA_START)) {
        return;
    }
    const std::uint64_t area = disk.size() - static_cast<std::uint64_t>(TUNING_AREA_START);
    for (std::size_t id = 0; id < static_cast<std::size_t>(DPS_BLOCK_COUNT); ++id) {
        for (const DpsField& field : DPS_LAYOUT) {
            const std::uint64_t offset = area + id * DPS_BLOCK_SIZE + field.offset;
            const std::string original =
                disk.read(offset, dpsElementSize(field.encoding) * field.count);
            inputs.push_back({"tuning." + std::to_string(id) + "." + field.key, true, offset,
                              original, otherFieldValues(field, original)});
        }
    }
}

void keepThoseThatBegin(std::vector<Input>& inputs, const std::vector<std::string>& beginnings) {
    const auto isWanted = [&beginnings](const Input& input) {
        return std::any_of(beginnings.begin(), beginnings.end(), [&input](const std::string& word) {
            return input.key.compare(0, word.size(), word) == 0;
        });
    };
    if (beginnings.empty()) {
        return;
    }
    inputs.erase(std::remove_if(inputs.begin(), inputs.end(), std::not_fn(isWanted)), inputs.end());
    if (inputs.empty()) {
        throw kit::KitError("no input of this unit begins with " + beginnings.front());
    }
}

void addMoves(Impact& impact, const std::vector<MovedOutput>& moved) {
    for (const MovedOutput& output : moved) {
        if (output.before != output.after) {
            impact.lines.insert(output.path);
            continue;
        }
        for (const MovedLine& line : output.lines) {
            const std::size_t number = line.line.before != 0 ? line.line.before : line.line.after;
            impact.lines.insert(output.path + ":" + std::to_string(number));
        }
    }
}

} // namespace

std::vector<Impact> findImpacts(const fs::path& root, const std::vector<std::string>& beginnings,
                                const Progress& progress) {
    const kit::ScratchFolder scratch;
    const fs::path copy = scratch.path() / "unit";
    kit::makeUnit(kit::inspectInputs(root), copy);
    const ChangedFile image(copy / (CONFIG_SHM_NAME + 1));
    const ChangedFile disk(copy / (BOOT_DISK + 1));
    std::vector<Input> inputs;
    addParams(inputs, image);
    addSlots(inputs, disk);
    addTuning(inputs, disk);
    keepThoseThatBegin(inputs, beginnings);

    const kit::EnteredRoot entered(copy);
    const std::string LETTERS = "ai";
    const Explanation baseline = explain(LETTERS);
    std::vector<Impact> impacts;
    for (const Input& input : inputs) {
        const ChangedFile& file = input.isOnDisk ? disk : image;
        Impact impact{input.key, input.values.size(), 0, {}};
        for (const std::string& value : input.values) {
            file.write(input.offset, value);
            const std::vector<MovedOutput> moved = movedOutputs(baseline, explain(LETTERS));
            impact.moving += moved.empty() ? 0U : 1U;
            addMoves(impact, moved);
        }
        file.write(input.offset, input.original);
        impacts.push_back(std::move(impact));
        progress(impacts.size(), inputs.size());
    }
    return impacts;
}

} // namespace orvane::desk
