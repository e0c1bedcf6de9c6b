// SPDX-License-Identifier: Apache-2.0
//
// Every value that the image can hold for a vehicle, from its bytes to the text of the AirPlay
// file's head.
#include "identity/vehicle_identity.h"
#include "tests/product/writers/airplay_unit.h"
#include "tuning/audio_profile.h"
#include "writers/airplay_writer.h"

#include <fcntl.h>
#include <unistd.h>

#include <array>
#include <cstdint>
#include <fstream>
#include <sstream>
#include <string>
#include <vector>

namespace orvane::test {
namespace {

/// The image stays open: it changes tens of thousands of times.
class EveryVehicleValueTest : public UnitTest {
protected:
    EveryVehicleValueTest() : image_(open(IMAGE_PATH, O_WRONLY | O_CLOEXEC)) {}
    ~EveryVehicleValueTest() override { close(image_); }

    void setValue(std::uint32_t offset, int value) const {
        const std::array<std::uint8_t, 2> encoded = {static_cast<std::uint8_t>(value % 256),
                                                     static_cast<std::uint8_t>(value / 256)};
        const ssize_t length = offset == PROFILE_OFFSET ? 2 : 1;
        ASSERT_EQ(pwrite(image_, encoded.data(), static_cast<std::size_t>(length), offset), length);
    }

    /// Sets the byte at `offset` to each value, and expects the head that `change` makes of the
    /// head of an image of zeros.
    template <class Change>
    void expectHeadOfEveryByte(std::uint32_t offset, const Change& change) {
        for (int value = 0; value < 256 && !HasFailure(); ++value) {
            setValue(offset, value);
            AirplayValues right;
            change(right, value);
            orvane::AirplayValues values;
            readVehicleValues(values);
            values.audioProfile = readAudioProfile();
            EXPECT_EQ(head(values), airplayHead(right)) << "value " << value;
        }
    }

    static std::string head(const orvane::AirplayValues& values) {
        std::ostringstream text;
        writeAirplayHead(text, values);
        return text.str();
    }

private:
    int image_;
};

TEST_F(EveryVehicleValueTest, AudioProfile) {
    orvane::AirplayValues values;
    values.model = "VOXA";
    values.brand = "MARL";
    AirplayValues right;
    for (int profile = 0; profile < 65536 && !HasFailure(); ++profile) {
        setValue(PROFILE_OFFSET, profile);
        values.audioProfile = readAudioProfile();
        EXPECT_EQ(values.audioProfile, profile);
        EXPECT_EQ(asksForTuning(profile), profile == 65535) << profile;
        right.profile = profileLines(std::to_string(profile));
        EXPECT_EQ(head(values), airplayHead(right));
    }
}

TEST_F(EveryVehicleValueTest, DriveSide) {
    expectHeadOfEveryByte(DRIVE_SIDE_OFFSET, [](AirplayValues& right, int value) {
        right.driveSide = std::to_string(value);
    });
}

TEST_F(EveryVehicleValueTest, Brand) {
    expectHeadOfEveryByte(BRAND_OFFSET, [](AirplayValues& right, int value) {
        right.brand = value == 2 ? "QUARION" : "MARL";
    });
}

TEST_F(EveryVehicleValueTest, FuelType) {
    constexpr std::array<const char*, 4> KNOWN = {"gasoline", "diesel", "cng", "electric"};
    for (int value = 0; value < 256; ++value) {
        setValue(FUEL_TYPE_OFFSET, value);
        std::string fuelType = "older";
        getFuelType(fuelType);
        ASSERT_EQ(fuelType, KNOWN.at(value < 4 ? static_cast<std::size_t>(value) : 0)) << value;
    }
}

/// The list of names is a file of the host, so it is read before a unit is entered.
class EveryModelTest : public EveryVehicleValueTest {
protected:
    static void SetUpTestSuite() {
        std::ifstream list(ORVANE_MODEL_NAMES);
        names().clear();
        for (std::string name; std::getline(list, name);) {
            names().push_back(name);
        }
    }
    static std::vector<std::string>& names() {
        static std::vector<std::string> list;
        return list;
    }
};

TEST_F(EveryModelTest, Model) {
    ASSERT_EQ(names().size(), 47U);
    expectHeadOfEveryByte(MODEL_OFFSET, [](AirplayValues& right, int value) {
        right.model =
            value >= 1 && value <= 47 ? names().at(static_cast<std::size_t>(value) - 1) : "VOXA";
    });
}

} // namespace
} // namespace orvane::test
