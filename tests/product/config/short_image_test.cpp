// SPDX-License-Identifier: Apache-2.0
//
// The only read past the end: an image that is shorter than the catalogue's layout.
#include "config/param_access.h"
#include "config/param_catalogue.h"
#include "tests/support/unit_test.h"

#include <unistd.h>

namespace orvane::test {

namespace {

class ShortImageTest : public UnitTest {};

TEST_F(ShortImageTest, EveryReadAtEveryLengthStaysInTheMappedPage) {
    ASSERT_GE(sysconf(_SC_PAGESIZE), long{CONFIG_IMAGE_SIZE});
    for (std::size_t length = 1; length <= CONFIG_IMAGE_SIZE; ++length) {
        SCOPED_TRACE(length);
        writeImage(std::string(length, '\xA5'));
        ConfigStore store;
        ASSERT_EQ(store.open(), 0);
        ASSERT_EQ(store.length, length);
        for (std::uint16_t number = 1; number <= PARAM_COUNT; ++number) {
            const ParamDescriptor& row = ParamCatalogue.rows[number - 1U];
            std::uint16_t value = 0;
            ASSERT_EQ(getParam(store, number, &value), PARAM_OK);
            // After the last byte of the image, the page holds zeros.
            std::uint32_t expected = row.offset < length ? 0xA5U : 0U;
            if (paramTypeSize(row.type) == 2 && row.offset + 1 < length) {
                expected |= 0xA500U;
            }
            ASSERT_EQ(value, expected) << "parameter " << number;
        }
    }
}

} // namespace

} // namespace orvane::test
