// SPDX-License-Identifier: Apache-2.0
//
// A configuration image of any length. The input is the count for readAllParams, 32 bits
// little-endian, and the image, of which the first 5,000 bytes count.
#include "config/config_store.h"
#include "config/param_access.h"
#include "fuzz/support.h"
#include "kit/host/descriptor.h"

#include <sys/mman.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstdint>
#include <cstring>
#include <string>
#include <string_view>
#include <vector>

namespace orvane::fuzz {

namespace {

constexpr std::size_t LONGEST_IMAGE = 5000;
constexpr std::uint32_t LAST_NUMBER = 171;
constexpr std::uint8_t UNTOUCHED = 0xA5; ///< what every output holds before a call

bool isTwoBytes(std::uint32_t number) {
    return number == 134 || (number >= 142 && number <= 144) || (number >= 152 && number <= 154) ||
           number == 158;
}

bool isKnown(std::uint32_t number) {
    return number >= 1 && number <= LAST_NUMBER;
}

/// By number: the total size of all lower-numbered parameters.
const std::vector<std::size_t>& offsets() {
    static const std::vector<std::size_t> sums = [] {
        std::vector<std::size_t> result = {0, 0};
        for (std::uint32_t number = 1; number < LAST_NUMBER; ++number) {
            result.push_back(result.back() + (isTwoBytes(number) ? 2 : 1));
        }
        return result;
    }();
    return sums;
}

/// The result of a getter: its status, and its output with the bytes after it.
struct Answer {
    std::uint32_t status = 0;
    std::array<std::uint8_t, 8> output{};

    Answer() { output.fill(UNTOUCHED); }
    bool operator==(const Answer& other) const {
        return status == other.status && output == other.output;
    }
    std::string text() const {
        return "status " + std::to_string(status) + ", output " +
               std::string(inputText(output.data(), output.size()));
    }
};

enum class Getter { any, u8, u16 };

Answer expectedAnswer(Getter getter, std::uint32_t number, const std::uint8_t* image) {
    Answer answer;
    if (!isKnown(number)) {
        answer.status = 1;
    } else if ((getter == Getter::u8 && isTwoBytes(number)) ||
               (getter == Getter::u16 && !isTwoBytes(number))) {
        answer.status = 2;
    } else if (image == nullptr) {
        answer.status = 3;
    } else {
        const std::uint8_t* place = image + offsets()[number];
        answer.output[0] = place[0];
        if (isTwoBytes(number)) {
            const auto value = static_cast<std::uint16_t>(place[0] + 256 * place[1]);
            std::memcpy(answer.output.data(), &value, sizeof value);
        }
    }
    return answer;
}

Answer foundAnswer(Getter getter, std::uint16_t number, const ConfigStore& store) {
    Answer answer;
    alignas(8) std::array<std::uint8_t, 8> output = answer.output;
    switch (getter) {
    case Getter::any:
        answer.status = getParam(store, number, output.data());
        break;
    case Getter::u8:
        answer.status = getParamU8(store, number, output.data());
        break;
    case Getter::u16:
        answer.status = getParamU16(store, number, reinterpret_cast<std::uint16_t*>(output.data()));
        break;
    }
    answer.output = output;
    return answer;
}

/// `image` is the store's content, or null when it is not open.
void checkGetters(const ConfigStore& store, std::uint16_t number, const std::uint8_t* image) {
    for (const Getter getter : {Getter::any, Getter::u8, Getter::u16}) {
        const Answer expected = expectedAnswer(getter, number, image);
        const Answer found = foundAnswer(getter, number, store);
        if (!(expected == found)) {
            fail("getter " + std::to_string(static_cast<int>(getter)) + ", parameter " +
                     std::to_string(number),
                 expected.text(), found.text());
        }
    }
}

std::size_t wholePages(std::size_t size) {
    const auto page = static_cast<std::size_t>(::sysconf(_SC_PAGESIZE));
    return (size + page - 1) / page * page;
}

/// The image in memory like a mapped file: zeros up to the end of its last page, and then a page
/// that can't be read.
struct MappedImage {
    std::size_t roomSize = wholePages(LONGEST_IMAGE);
    std::uint8_t* room = static_cast<std::uint8_t*>(
        ::mmap(nullptr, roomSize + wholePages(1), PROT_NONE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0));

    /// Returns where the image begins. An empty one can't be mapped, and counts as a page of zeros.
    std::uint8_t* hold(std::string_view image) const {
        const std::size_t size = wholePages(std::max<std::size_t>(image.size(), 1));
        std::uint8_t* start = room + roomSize - size;
        if (::mprotect(start, size, PROT_READ | PROT_WRITE) != 0) {
            fail("mprotect", "0", std::strerror(errno));
        }
        std::memset(start, 0, size);
        std::copy(image.begin(), image.end(), start);
        return start;
    }
};

struct Target {
    Unit unit;
    kit::Descriptor published = unit.makeFile(CONFIG_SHM_NAME);
    MappedImage mapped;
};

Target& target() {
    static Target instance;
    return instance;
}

/// The first bytes of the image as parameter numbers.
std::vector<std::uint16_t> numbersIn(std::string_view image) {
    std::vector<std::uint16_t> numbers;
    for (std::size_t at = 0; at + 1 < std::min<std::size_t>(image.size(), 16); at += 2) {
        const auto low = static_cast<std::uint8_t>(image[at]);
        const auto high = static_cast<std::uint8_t>(image[at + 1]);
        numbers.push_back(static_cast<std::uint16_t>(low + 256 * high));
    }
    return numbers;
}

/// The getters on a hand-made store: every number while it is open, some numbers in each state in
/// which it is not.
void checkAllGetters(std::string_view image, const std::uint8_t* mapped) {
    std::vector<std::uint16_t> numbers = numbersIn(image);
    numbers.insert(numbers.end(), {0, 1, 22, 134, 171, 172, 65535});
    ConfigStore store;
    for (const std::uint16_t number : numbers) {
        store.init();
        checkGetters(store, number, nullptr);
        store.data = mapped; // nothing is open
        checkGetters(store, number, nullptr);
        store.descriptor = STDIN_FILENO;
        store.data = nullptr; // open, and not mapped
        checkGetters(store, number, nullptr);
    }
    for (std::uint16_t number = 0; number <= LAST_NUMBER + 9; ++number) {
        numbers.push_back(number);
    }
    store.data = mapped;
    store.length = static_cast<std::uint32_t>(image.size());
    for (const std::uint16_t number : numbers) {
        checkGetters(store, number, mapped);
    }
    store.init(); // the store owns neither
}

void requireClosed(const ConfigStore& store) {
    requireSame("descriptor of a closed store", -1, store.descriptor);
    requireSame("data of a closed store", 0, store.data == nullptr ? 0 : 1);
}

void checkBulk(std::string_view image, const std::uint8_t* mapped, std::uint32_t count) {
    const std::size_t slots = std::min<std::size_t>(count, LAST_NUMBER + 1);
    std::vector<std::uint16_t> values(slots, UNTOUCHED);
    std::vector<std::uint16_t> expected = values;
    std::int32_t expectedStatus = -1; // an empty object can't be mapped
    if (!image.empty()) {
        expectedStatus = count > LAST_NUMBER ? 1 : 0;
        for (std::uint32_t number = 1; number <= slots; ++number) {
            const std::uint8_t* place = mapped + (isKnown(number) ? offsets()[number] : 0);
            expected[number - 1] = static_cast<std::uint16_t>(
                isKnown(number) ? place[0] + (isTwoBytes(number) ? 256 * place[1] : 0) : 0);
        }
    }
    ConfigStore store;
    std::int32_t status = 0;
    const std::string said =
        target().unit.run([&] { status = readAllParams(store, values.data(), count); });
    requireEqual("said", "", said);
    requireSame("readAllParams", expectedStatus, status);
    for (std::size_t slot = 0; slot < slots; ++slot) {
        if (expected[slot] != values[slot]) {
            fail("values[" + std::to_string(slot) + "]", std::to_string(expected[slot]),
                 std::to_string(values[slot]));
        }
    }
    requireClosed(store);
}

/// An open store shows the image and the zeros after it; a closed one holds nothing.
void openAndClose(std::string_view image, const std::uint8_t* mapped) {
    ConfigStore store;
    requireSame("open", image.empty() ? -1 : 0, store.open());
    if (store.data != nullptr) {
        const std::size_t pages = wholePages(image.size());
        requireSame("length", static_cast<std::int64_t>(image.size()), store.length);
        requireEqual("the mapped pages", inputText(mapped, pages), inputText(store.data, pages));
        void* const place = const_cast<std::uint8_t*>(store.data);
        store.close();
        requireSame("msync of what was unmapped", -1, ::msync(place, pages, MS_ASYNC));
    }
    requireClosed(store);
    store.close();
    requireClosed(store);
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
    std::uint32_t count = 0;
    std::uint32_t weight = 1;
    for (const char byte : take(input, sizeof count)) {
        count += weight * static_cast<std::uint8_t>(byte);
        weight *= 256;
    }
    const std::string_view image = take(input, LONGEST_IMAGE);
    const std::uint8_t* mapped = target().mapped.hold(image);
    setContent(target().published, image);

    checkAllGetters(image, mapped);
    requireEqual("said", "", target().unit.run([&] { openAndClose(image, mapped); }));
    checkBulk(image, mapped, count);
    return 0;
}
