// SPDX-License-Identifier: Apache-2.0
//
// A boot disk on which every byte of the record area depends on its place, for the tests of all
// operations on that area.
#pragma once

#include "tests/support/unit_test.h"

#include <sys/mman.h>
#include <unistd.h>

#include <array>
#include <cstddef>
#include <cstdint>
#include <string>

namespace orvane::test {

struct SlotPlace {
    std::uint32_t slot;
    std::uint32_t size; ///< bytes
    std::size_t offset; ///< from the area's base
};

constexpr std::array<SlotPlace, 18> SLOT_PLACES = {{{0, 1, 0},
                                                    {1, 16, 1},
                                                    {2, 16, 17},
                                                    {3, 16, 33},
                                                    {4, 16, 49},
                                                    {5, 16, 65},
                                                    {6, 16, 81},
                                                    {7, 16, 97},
                                                    {8, 16, 113},
                                                    {9, 8, 129},
                                                    {10, 1, 2185},
                                                    {11, 1, 2186},
                                                    {12, 1, 2187},
                                                    {13, 1, 2188},
                                                    {14, 1, 2189},
                                                    {15, 136, 1},
                                                    {16, 24, 2190},
                                                    {17, 2, 2214}}};

constexpr std::array<std::uint32_t, 7> UNKNOWN_SLOTS = {18,  19,         255,       256,
                                                        265, 0x80000009, 0xFFFFFFFF};

/// The area's base and the two fixed areas: bytes before the end of the disk.
constexpr std::size_t BASE_FROM_END = 0x100000;
constexpr std::size_t AUX_FROM_END = 0xFF400;
constexpr std::size_t TUNING_FROM_END = 0xFF000;

/// The byte at `offset` of the area: never 0, and different at neighbouring places.
inline char markedAreaByte(std::size_t offset) {
    return static_cast<char>(1 + (offset * 37 + (offset >> 8) * 11) % 255);
}

/// The length of `bytes` in the operations' type.
template <class Bytes>
std::uint32_t lengthOf(const Bytes& bytes) {
    return static_cast<std::uint32_t>(bytes.size());
}

/// A buffer that ends with the last accessible byte: a transfer beyond it fails or is short.
class EdgeOfMemory {
public:
    explicit EdgeOfMemory(std::size_t usable)
        : usable_(usable), pages_(mmap(nullptr, 2 * pageSize_, PROT_READ | PROT_WRITE,
                                       MAP_PRIVATE | MAP_ANONYMOUS, -1, 0)),
          isMade_(pages_ != MAP_FAILED && usable <= pageSize_ &&
                  mprotect(begin() + usable, pageSize_, PROT_NONE) == 0) {}
    ~EdgeOfMemory() { munmap(pages_, 2 * pageSize_); }
    EdgeOfMemory(const EdgeOfMemory&) = delete;
    EdgeOfMemory& operator=(const EdgeOfMemory&) = delete;

    bool isMade() const { return isMade_; }
    char* begin() const { return static_cast<char*>(pages_) + pageSize_ - usable_; }

private:
    std::size_t usable_;
    std::size_t pageSize_ = static_cast<std::size_t>(sysconf(_SC_PAGESIZE));
    void* pages_ = nullptr;
    bool isMade_ = false;
};

/// The disk is 2 MiB long: zeros, then the marked area.
class AreaDiskTest : public UnitTest {
protected:
    AreaDiskTest() { setDiskFromEnd(BASE_FROM_END, area()); }

    /// The content of the area as the fixture made it.
    static const std::string& area() {
        static const std::string content = [] {
            std::string bytes(BASE_FROM_END, '\0');
            for (std::size_t offset = 0; offset < bytes.size(); ++offset) {
                bytes[offset] = markedAreaByte(offset);
            }
            return bytes;
        }();
        return content;
    }

    static std::string areaWith(std::size_t offset, const std::string& bytes) {
        std::string content = area();
        return content.replace(offset, bytes.size(), bytes);
    }

    /// The whole disk is zeros, followed by `content`.
    static void expectArea(const std::string& content) {
        ASSERT_EQ(2 * MEBIBYTE, std::filesystem::file_size(DISK_PATH));
        const std::string disk = diskFromEnd(2 * MEBIBYTE, 2 * MEBIBYTE);
        const std::string expected = std::string(MEBIBYTE, '\0') + content;
        ASSERT_EQ(expected.size(), disk.size());
        for (std::size_t place = 0; place < disk.size(); ++place) {
            if (disk[place] != expected[place]) {
                FAIL() << "first difference " << place
                       << " bytes from the start of the disk: " << int{disk[place]}
                       << " instead of " << int{expected[place]};
            }
        }
    }
    static void expectUntouchedDisk() { expectArea(area()); }
};

} // namespace orvane::test
