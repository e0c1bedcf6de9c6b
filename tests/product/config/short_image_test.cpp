// SPDX-License-Identifier: Apache-2.0
//
// The only read past the end: an image that is shorter than the catalogue's layout.
#include "config/param_access.h"
#include "tests/product/config/param_numbers.h"
#include "tests/support/unit_test.h"

#include <unistd.h>

#include <algorithm>

namespace orvane::test {

namespace {

class ShortImageTest : public UnitTest {};

// Rules: IMG-07
TEST_F(ShortImageTest, EveryReadAtEveryLengthStaysInTheMappedPage) {
    ASSERT_GE(sysconf(_SC_PAGESIZE), 179);
    for (std::size_t length = 1; length <= 179; ++length) {
        SCOPED_TRACE(length);
        writeImage(std::string(length, '\xA5'));
        ConfigStore store;
        ASSERT_EQ(store.open(), 0);
        ASSERT_EQ(store.length, length);
        std::uint32_t offset = 0; // the values lie one after the other
        for (std::uint16_t number = 1; number <= 171; ++number) {
            const bool isTwoBytes =
                std::count(TWO_BYTE_PARAMS.begin(), TWO_BYTE_PARAMS.end(), number) == 1;
            std::uint16_t value = 0;
            ASSERT_EQ(getParam(store, number, &value), PARAM_OK);
            // After the last byte of the image, the page holds zeros.
            std::uint32_t expected = offset < length ? 0xA5U : 0U;
            if (isTwoBytes && offset + 1 < length) {
                expected |= 0xA500U;
            }
            ASSERT_EQ(value, expected) << "parameter " << number;
            offset += isTwoBytes ? 2 : 1;
        }
        ASSERT_EQ(offset, 179U);
    }
}

} // namespace

} // namespace orvane::test
