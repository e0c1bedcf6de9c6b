// SPDX-License-Identifier: Apache-2.0
//
// A tuning area of any content. The first byte of the input, modulo 12, chooses the block: 0 to 9,
// or 10 or 11, which do not exist. The rest is the area from its start, filled up with zeros.
#include "config/boot_disk.h"
#include "fuzz/support.h"
#include "fuzz/tuning_reading.h"
#include "kit/host/descriptor.h"
#include "kit/host/kit_error.h"
#include "tuning/tuning_file.h"

#include <unistd.h>

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

namespace orvane::fuzz {

namespace {

constexpr off_t DISK_SIZE = 0x100000; ///< bytes: the record area and nothing before it
constexpr off_t TUNING_AREA = DISK_SIZE - 0xFF000;
constexpr int BLOCKS = 10;
constexpr char TUNING_FILE[] = "/tmp/tuning.txt";
/// Longer than any tuning file, so that a missing truncation shows.
const std::string OLD_CONTENT(4096, 'x');

struct Target {
    Unit unit;
    kit::Descriptor disk = unit.makeFile(BOOT_DISK);
    kit::Descriptor tuningFile = unit.makeFile(TUNING_FILE);

    Target() {
        if (::ftruncate(disk.number(), DISK_SIZE) != 0) {
            throw kit::systemError("cannot make the boot disk");
        }
    }

    void setArea(const std::string& area) const {
        requireSame("bytes written to the disk", static_cast<std::int64_t>(area.size()),
                    ::pwrite(disk.number(), area.data(), area.size(), TUNING_AREA));
    }
};

Target& target() {
    static Target instance;
    return instance;
}

} // namespace

} // namespace orvane::fuzz

extern "C" int LLVMFuzzerInitialize(int* /*argc*/, char*** /*argv*/) {
    orvane::fuzz::target();
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    using namespace orvane::fuzz;
    std::string_view input = inputText(data, size);
    const int id = size == 0 ? 0 : *data % (BLOCKS + 2);
    take(input, 1);
    std::string area(take(input, BLOCKS * BLOCK_SIZE));
    area.resize(BLOCKS * BLOCK_SIZE);
    target().setArea(area);
    setContent(target().tuningFile, OLD_CONTENT);

    requireEqual("said", "",
                 target().unit.run([&] { orvane::generateTuningFile(id, TUNING_FILE); }));

    const std::string written = contentOf(target().unit.hostPath(TUNING_FILE));
    if (id < BLOCKS) {
        Block block{};
        const auto start = area.begin() + id * static_cast<std::ptrdiff_t>(BLOCK_SIZE);
        std::copy(start, start + BLOCK_SIZE, block.begin());
        requireTuningOf(block, id, written);
    } else {
        requireEqual("older file of a block that does not exist", OLD_CONTENT, written);
    }
    return 0;
}
