// SPDX-License-Identifier: Apache-2.0
//
// A unit with the product data of the AirPlay file, and the expected content of that file.
#pragma once

#include "tests/product/image_offsets.h"
#include "tests/support/unit_test.h"

#include <cstdint>
#include <initializer_list>
#include <string>

namespace orvane::test {

constexpr char AIRPLAY_OUTPUT[] = "/tmp/airplay.conf";
constexpr char AIRPLAY_TEMPLATE[] = "/fs/mp/etc/airplay_static.conf";
constexpr char AIRPLAY_STOCK[] = "/fs/mp/etc/airplay.conf";

/// These bytes, as a text.
inline std::string bytes(std::initializer_list<int> values) {
    std::string text;
    for (const int value : values) {
        text.push_back(static_cast<char>(value));
    }
    return text;
}

/// The variable parts of a generated head, as they are with an image of zeros.
struct AirplayValues {
    std::string model = "VOXA";
    std::string brand = "MARL";
    std::string profile = "# audio profile for QWA\n"
                          "audioProfile = 0\n"
                          "\n";
    std::string driveSide = "0";
};

inline std::string profileLines(const std::string& number) {
    return "# audio profile for QWA\naudioProfile = " + number + "\n\n";
}

inline std::string airplayHead(const AirplayValues& values) {
    return "# Default name of the accessory if a name is not specified in the user prefs.\n"
           "name = CarPlay\n"
           "\n"
           "# Model of the accessory.\n"
           "model = " +
           values.model +
           "\n"
           "\n"
           "# Manufacturer of the accessory.\n"
           "manufacturer = Marl Motor Company\n"
           "\n"
           "# OEM Icon Label\n"
           "oemIconLabel = VOXA\n"
           "\n"
           "# OEM Icon Visibility Setting\n"
           "oemIconVisible = 1\n"
           "\n"
           "# 104x104 OEM Icon png path\n"
           "oemIconPath = /fs/mp/etc/" +
           values.brand +
           "/oemIcon.png\n"
           "\n" +
           values.profile +
           "# rightHandDrive mode setting right\n"
           "rightHandDrive = " +
           values.driveSide +
           "\n"
           "\n";
}

/// The head with an image of zeros, and without an image.
inline std::string plainAirplayHead() {
    return airplayHead({});
}
inline std::string airplayHeadWithoutImage() {
    AirplayValues values;
    values.profile = "";
    return airplayHead(values);
}

/// A unit that has the template and the stock file.
class AirplayUnitTest : public UnitTest {
protected:
    AirplayUnitTest() {
        writeFile(AIRPLAY_TEMPLATE, "static = 1\n");
        writeFile(AIRPLAY_STOCK, "stock = 1\n");
    }
};

} // namespace orvane::test
