// SPDX-License-Identifier: Apache-2.0
//
// Prints the check value that catalogues of CRCs give for orvane's CRC.
#include <config/crc32.h>

#include <iostream>

int main() {
    std::uint32_t crc = orvane::CRC32_INITIAL;
    for (const char digit : {'1', '2', '3', '4', '5', '6', '7', '8', '9'}) {
        crc = orvane::crc32Step(crc, static_cast<std::uint8_t>(digit));
    }
    std::cout << std::hex << ~crc << '\n';
}
