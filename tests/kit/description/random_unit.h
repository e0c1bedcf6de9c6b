// SPDX-License-Identifier: Apache-2.0
//
// Random parts of units, odd ones among them. The same seed gives the same unit everywhere.
#pragma once

#include "kit/description/conflicts.h"
#include "kit/description/unit_description.h"
#include "tuning/dps_block.h"

#include <cstdint>
#include <random>
#include <string>
#include <vector>

namespace orvane::test {

class RandomUnit {
public:
    explicit RandomUnit(std::uint32_t seed) : engine_(seed) {}

    /// 0 to `end` - 1.
    std::size_t below(std::size_t end) { return engine_() % end; }
    bool oneIn(std::size_t count) { return below(count) == 0; }

    template <class Choices>
    auto any(const Choices& choices) {
        return *(std::begin(choices) + static_cast<std::ptrdiff_t>(below(std::size(choices))));
    }

    /// Any bytes, or text, or mostly zeros, or one repeated byte.
    std::string bytes(std::size_t size) {
        const std::size_t kind = below(5);
        const char same = static_cast<char>(engine_());
        std::string result;
        while (result.size() < size) {
            const char byte = static_cast<char>(engine_());
            const char letter = " aZ0=\n\t\"\\#'\r."[below(13)];
            result += kind == 0   ? byte
                      : kind == 1 ? letter
                      : kind == 2 ? (oneIn(12) ? byte : '\0')
                      : kind == 3 ? same
                                  : '\0';
        }
        return result;
    }

    DpsBlock block() {
        const std::string content = bytes(DPS_BLOCK_SIZE);
        DpsBlock result{};
        std::copy(content.begin(), content.end(), result.bytes.begin());
        return result;
    }

    /// A name that a file can have.
    std::string name() {
        const std::vector<std::string> parts = {
            "a", "hd0", " ",   ".",  "\n", "\x7F",     "\xFF", "\"",   "\\", "'''",
            "=", "#",   "[x]", "\t", "é",  "\xE2\x82", "hex:", "conf", "\r", "\x01"};
        std::string result;
        do {
            result += any(parts);
        } while (oneIn(2) || result == "." || result == "..");
        return result;
    }

    /// A whole unit that makeUnit accepts. Its disk has raw bytes anywhere, even between the
    /// records.
    kit::UnitDescription unit();

private:
    /// A folder of a standard unit, or another one, or one below a folder that `unit` already has.
    std::string folder(const kit::UnitDescription& unit) {
        const std::vector<std::string> folders = {
            "",     "/tmp", "/fs/mp/etc", "/fs/mp/etc/mm",        "/fs/rwdata/.Version", "/fs",
            "/dev", "/new", "/new/deep",  "/fs/rwdata/elsewhere", "/" + name()};
        const std::string chosen = any(folders);
        return unit.folders.empty() || oneIn(2) ? chosen : unit.folders.front() + chosen;
    }

    std::mt19937 engine_;
};

inline kit::UnitDescription RandomUnit::unit() {
    kit::UnitDescription unit;
    const std::uint32_t sizes[] = {0, 1, 21, 134, 135, 178, 179, 180, 4096, 5000};
    unit.image.size = any(sizes);
    const std::string image = bytes(unit.image.size);
    if (!image.empty()) {
        unit.image.bytes[0] = image;
    }
    const std::uint64_t disks[] = {0,       1,       700,     1044479, 1044480, 1048447,
                                   1048575, 1048576, 1048577, 1500000, 2097152};
    unit.disk.size = any(disks);
    for (std::size_t run = below(12); run > 0 && unit.disk.size > 0; --run) {
        // Most of them around the records, which are at the start of the last mebibyte.
        const std::uint64_t base = unit.disk.size > 0x100000 ? unit.disk.size - 0x100000 : 0;
        const std::uint64_t at =
            oneIn(4) ? below(unit.disk.size) : (base + below(6200)) % unit.disk.size;
        unit.disk.bytes[at] = bytes(1 + below(200)).substr(0, unit.disk.size - at);
    }
    for (std::size_t entry = below(14); entry > 0; --entry) {
        const std::string path = folder(unit) + "/" + name();
        const std::string places[] = {
            path,   path,     path,       path,
            "/tmp", "/fs/mp", "/dev/hd0", "/fs/tmpfs/VS_DIAG_SERVICE_CONFIG_SHARED_MEM"};
        kit::UnitDescription next = unit;
        const std::string place = any(places);
        switch (below(5)) {
        case 0:
            next.folders.push_back(place);
            break;
        case 1:
            next.links[place] = oneIn(2) ? name() : "/" + name() + "/../" + name();
            break;
        case 2:
            next.sparseFiles[place] = {below(3) * 100000, {}};
            break;
        case 3:
            next.absent.push_back(place);
            break;
        default:
            next.files[place] = bytes(any(std::vector<std::size_t>{0, 1, 63, 64, 300, 4096, 9000}));
            break;
        }
        if (!kit::findPathConflict(next)) {
            unit = next;
        }
    }
    return unit;
}

} // namespace orvane::test
