// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/compare/impact.h"

#include "config/boot_disk.h"
#include "config/config_store.h"
#include "config/param_catalogue.h"
#include "config/record_slots.h"
#include "kit/description/value_places.h"
#include "kit/enter/entered_root.h"
#include "kit/host/bytes.h"
#include "kit/host/changed_file.h"
#include "kit/host/interruption.h"
#include "kit/host/kit_error.h"
#include "kit/host/little_endian.h"
#include "kit/host/scratch_folder.h"
#include "kit/tuning/tuning_encode.h"
#include "kit/unit/describe_inputs.h"
#include "kit/unit/make_unit.h"
#include "main/options.h"
#include "orvane_unit/compare/output_differences.h"
#include "orvane_unit/compare/text_diff.h"
#include "orvane_unit/explain/explain.h"
#include "orvane_unit/explain/explanation.h"
#include "tuning/dps_block.h"

#include <algorithm>
#include <array>
#include <cstdint>
#include <functional>
#include <optional>
#include <system_error>
#include <tuple>
#include <utility>

namespace orvane::desk {

namespace {

namespace fs = std::filesystem;

using kit::ValueKey;
using kit::ValuePlace;

/// The configuration image or the boot disk of the copy; nothing if it is not a regular file.
using CopiedFile = std::optional<kit::ChangedFile>;

CopiedFile openCopied(const fs::path& path) {
    std::error_code error;
    if (fs::is_regular_file(fs::symlink_status(path, error))) {
        return kit::ChangedFile(path);
    }
    return std::nullopt;
}

/// One input: a place in a file of the copy, and the values to try there.
struct Input {
    ValueKey key;
    const kit::ChangedFile* file = nullptr;
    std::uint64_t offset = 0; ///< bytes
    std::string original;
    std::vector<std::string> values;
};

/// Other values than `original`: each bit flipped, the small codes, the ends of its range and of
/// the tables. An element of a tuning field, which can only be a code or a number, needs fewer.
std::vector<std::string> otherValues(const std::string& original, bool isElement = false) {
    const std::vector<std::uint32_t> codes =
        isElement ? std::vector<std::uint32_t>{0, 1, 2, 3, 0xFFFF}
                  : std::vector<std::uint32_t>{0, 1, 2, 3, 4, 47, 48, 255, 256, 0xFFFE, 0xFFFF};
    std::vector<std::string> values;
    const auto number = static_cast<std::uint32_t>(kit::fromLittleEndian(original));
    const auto add = [&](std::uint32_t value) {
        const std::string bytes = kit::littleEndian(value, original.size());
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

/// The field's bytes with each of its elements changed in turn.
std::vector<std::string> otherFieldValues(const DpsField& field, const std::string& original) {
    std::vector<std::string> values;
    if (field.encoding == DpsEncoding::code2) {
        for (unsigned code = 1; code < 4; ++code) {
            const auto byte = static_cast<unsigned char>(original[0]);
            values.push_back(kit::littleEndian(byte ^ code << field.bit, 1));
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

/// Every parameter, byte of a slot and tuning field.
std::vector<ValueKey> allKeys() {
    std::vector<ValueKey> keys;
    for (std::uint16_t number = 1; number <= PARAM_COUNT; ++number) {
        keys.push_back(kit::paramKey(number));
    }
    for (std::uint32_t slot = 0; slot < RECORD_SLOT_COUNT; ++slot) {
        const bool isRepeated = !kit::slotsWithin(slot).empty();
        for (std::uint32_t byte = 0; !isRepeated && byte < kit::slotPlace(slot).size; ++byte) {
            keys.push_back(kit::slotByteKey(slot, byte));
        }
    }
    for (std::uint32_t block = 0; block < DPS_BLOCK_COUNT; ++block) {
        for (const DpsField& field : DPS_LAYOUT) {
            keys.push_back(kit::tuningFieldKey(block, field.key));
        }
    }
    return keys;
}

/// The input of `key`; nothing where neither `image` nor `disk` has a place for it.
std::optional<Input> inputOf(const ValueKey& key, const CopiedFile& image, const CopiedFile& disk) {
    const ValuePlace place = kit::valuePlace(key);
    const CopiedFile& file = place.isOnDisk ? disk : image;
    if (!file || file->size() < place.leastSize) {
        return std::nullopt;
    }
    const std::uint64_t offset = place.offsetIn(file->size());
    const std::string original = file->read(offset, place.mask.size());
    return Input{key, &*file, offset, original,
                 key.kind == ValueKey::Kind::tuningField
                     ? otherFieldValues(kit::tuningField(key.name), original)
                     : otherValues(original)};
}

bool beginsWith(const ValueKey& key, const std::string& prefix) {
    return kit::keyText(key).compare(0, prefix.size(), prefix) == 0;
}

/// The `keys` that begin with one of `prefixes`, or all if there are none.
std::vector<ValueKey> withPrefixes(std::vector<ValueKey> keys,
                                   const std::vector<std::string>& prefixes) {
    const auto isWanted = [&prefixes](const ValueKey& key) {
        return prefixes.empty() ||
               std::any_of(prefixes.begin(), prefixes.end(),
                           [&key](const std::string& prefix) { return beginsWith(key, prefix); });
    };
    keys.erase(std::remove_if(keys.begin(), keys.end(), std::not_fn(isWanted)), keys.end());
    return keys;
}

/// Throws for a prefix with which no input begins.
void requireInputs(const std::vector<Input>& inputs, const std::vector<std::string>& prefixes) {
    for (const std::string& prefix : prefixes) {
        if (std::none_of(inputs.begin(), inputs.end(),
                         [&prefix](const Input& input) { return beginsWith(input.key, prefix); })) {
            throw kit::KitError("no input of this unit begins with " + prefix);
        }
    }
}

void addLines(const std::vector<OutputDifference>& differences, Impact& impact) {
    for (const OutputDifference& output : differences) {
        if (output.before != output.after) {
            impact.lines.insert({output.path, 0});
            continue;
        }
        for (const DifferingLine& line : output.lines) {
            const std::size_t number = line.line.before != 0 ? line.line.before : line.line.after;
            impact.lines.insert({output.path, number});
        }
    }
}

} // namespace

bool operator<(const OutputLine& one, const OutputLine& other) {
    return std::tie(one.path, one.number) < std::tie(other.path, other.number);
}

std::vector<Impact> findImpacts(const fs::path& root, const std::vector<std::string>& prefixes,
                                const Progress& progress) {
    const kit::ScratchFolder scratch;
    const fs::path copy = scratch.path() / "unit";
    kit::makeUnit(kit::describeInputs(root), copy);
    const CopiedFile image = openCopied(copy / (CONFIG_SHM_NAME + 1));
    const CopiedFile disk = openCopied(copy / (BOOT_DISK + 1));
    std::vector<Input> inputs;
    for (const ValueKey& key : withPrefixes(allKeys(), prefixes)) {
        if (std::optional<Input> input = inputOf(key, image, disk)) {
            inputs.push_back(std::move(*input));
        }
    }
    requireInputs(inputs, prefixes);

    const kit::EnteredRoot entered(copy);
    const std::vector<std::string> both = {std::string{'-', AIRPLAY_OPTION, IAP_OPTION}};
    const Explanation baseline = explain(entered, both);
    std::vector<Impact> impacts;
    for (const Input& input : inputs) {
        Impact impact{input.key, input.values.size(), 0, {}};
        kit::throwIfInterrupted();
        for (const std::string& value : input.values) {
            input.file->write(input.offset, value);
            const std::vector<OutputDifference> differences =
                outputDifferences(baseline, explain(entered, both));
            impact.changing += differences.empty() ? 0U : 1U;
            addLines(differences, impact);
        }
        input.file->write(input.offset, input.original);
        impacts.push_back(std::move(impact));
        progress(impacts.size(), inputs.size());
    }
    return impacts;
}

} // namespace orvane::desk
