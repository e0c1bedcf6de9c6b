// SPDX-License-Identifier: Apache-2.0
#include "config/config_store.h"
#include "identity/vehicle_identity.h"
#include "tests/product/image_offsets.h"
#include "tests/support/model_list.h"
#include "tests/support/unit_test.h"

#include <fstream>

namespace orvane::test {

/// The caller's string before: longer than any result, so that a remainder shows.
constexpr char OLD_TEXT[] = "earlier content, longer than any of the results";

class VehicleIdentityTest : public UnitTest {
protected:
    static std::string brand() {
        std::string text = OLD_TEXT;
        getBrandName(text);
        return text;
    }
    static std::string fuelType() {
        std::string text = OLD_TEXT;
        getFuelType(text);
        return text;
    }
    static std::string model() {
        std::string text = OLD_TEXT;
        getModelName(text);
        return text;
    }

    static void setByte(std::uint32_t offset, int value) {
        setImage(offset, std::string(1, static_cast<char>(value)));
    }

    /// An image of `filler` bytes, except for the one at `offset`.
    static void writeImageBut(int filler, std::uint32_t offset, int value) {
        writeImage(std::string(179, static_cast<char>(filler)));
        setByte(offset, value);
    }

    static void expectDefaults() {
        EXPECT_EQ(getRightHandDrive(), 0U);
        EXPECT_EQ(brand(), "MARL");
        EXPECT_EQ(fuelType(), "gasoline");
        EXPECT_EQ(model(), "VOXA");
    }

    /// How many parts of the image the system says are mapped. Leaves the unit.
    int mappingsOfTheImage() {
        leave();
        std::ifstream maps("/proc/self/maps");
        EXPECT_TRUE(maps.is_open());
        int count = 0;
        for (std::string line; std::getline(maps, line);) {
            count += line.find("VS_DIAG_SERVICE") == std::string::npos ? 0 : 1;
        }
        return count;
    }
};

TEST_F(VehicleIdentityTest, ConstantsNameParametersSlotAndDefaults) {
    EXPECT_EQ(RIGHT_HAND_DRIVE_PARAM, 22);
    EXPECT_EQ(BRAND_PARAM, 36);
    EXPECT_EQ(FUEL_TYPE_PARAM, 50);
    EXPECT_EQ(MODEL_PARAM, 139);
    EXPECT_EQ(SERIAL_RECORD_SLOT, 9U);
    EXPECT_STREQ(DEFAULT_UNIT_SERIAL, "ABCD1234abc");
    EXPECT_STREQ(MODEL_NAME_FALLBACK, "VOXA");
}

// Rules: VEH-11
TEST_F(VehicleIdentityTest, DriveSideIsTheRawValue) {
    for (int value = 0; value <= 255; ++value) {
        setByte(DRIVE_SIDE_OFFSET, value);
        EXPECT_EQ(getRightHandDrive(), static_cast<unsigned>(value));
    }
}

// Rules: VEH-10
TEST_F(VehicleIdentityTest, DriveSideIsReadFromItsOwnByte) {
    writeImageBut(0x55, DRIVE_SIDE_OFFSET, 0);
    EXPECT_EQ(getRightHandDrive(), 0U);
    writeImageBut(0, DRIVE_SIDE_OFFSET, 0xA5);
    EXPECT_EQ(getRightHandDrive(), 0xA5U);
}

// Rules: VEH-07, VEH-08
TEST_F(VehicleIdentityTest, BrandCodeTwoIsTheSecondBrandAndAnyOtherTheFirst) {
    for (int value = 0; value <= 255; ++value) {
        SCOPED_TRACE(value);
        setByte(BRAND_OFFSET, value);
        EXPECT_EQ(brand(), value == 2 ? "QUARION" : "MARL");
    }
}

// Rules: VEH-06
TEST_F(VehicleIdentityTest, BrandIsReadFromItsOwnByte) {
    writeImageBut(2, BRAND_OFFSET, 1);
    EXPECT_EQ(brand(), "MARL");
    writeImageBut(0, BRAND_OFFSET, 2);
    EXPECT_EQ(brand(), "QUARION");
}

// Rules: PAR-13, PAR-14
TEST_F(VehicleIdentityTest, FuelTypeHasThreeCodesAndIsGasolineForAllOthers) {
    for (int value = 0; value <= 255; ++value) {
        SCOPED_TRACE(value);
        setByte(FUEL_TYPE_OFFSET, value);
        const std::string expected = value == 1   ? "diesel"
                                     : value == 2 ? "cng"
                                     : value == 3 ? "electric"
                                                  : "gasoline";
        EXPECT_EQ(fuelType(), expected);
    }
}

// Rules: PAR-13
TEST_F(VehicleIdentityTest, FuelTypeIsReadFromItsOwnByte) {
    writeImageBut(1, FUEL_TYPE_OFFSET, 2);
    EXPECT_EQ(fuelType(), "cng");
    writeImageBut(0, FUEL_TYPE_OFFSET, 3);
    EXPECT_EQ(fuelType(), "electric");
}

// Rules: VEH-02
TEST_F(VehicleIdentityTest, ModelCodesOneTo47GiveTheirEntry) {
    for (int code = 1; code <= 47; ++code) {
        SCOPED_TRACE(code);
        setByte(MODEL_OFFSET, code);
        EXPECT_EQ(model(), listedModel(code));
    }
}

TEST_F(VehicleIdentityTest, FirstSecondBrandAndLastModelHaveTheirNames) {
    setByte(MODEL_OFFSET, 1);
    EXPECT_EQ(model(), "Marl Tulvari");
    setByte(MODEL_OFFSET, 26);
    EXPECT_EQ(model(), "Quarion Velmira");
    setByte(MODEL_OFFSET, 47);
    EXPECT_EQ(model(), "Marl Quillon");
}

// Rules: VEH-03
TEST_F(VehicleIdentityTest, ModelCode32GivesTheNameOfCodeOne) {
    setByte(MODEL_OFFSET, 32);
    EXPECT_EQ(model(), "Marl Tulvari");
}

// Rules: VEH-04
TEST_F(VehicleIdentityTest, ModelCodesOutsideTheTableGiveTheFallback) {
    setByte(MODEL_OFFSET, 0);
    EXPECT_EQ(model(), "VOXA");
    for (int code = 48; code <= 255; ++code) {
        SCOPED_TRACE(code);
        setByte(MODEL_OFFSET, code);
        EXPECT_EQ(model(), "VOXA");
    }
}

// Rules: VEH-01
TEST_F(VehicleIdentityTest, ModelIsReadFromItsOwnByte) {
    writeImageBut(1, MODEL_OFFSET, 26);
    EXPECT_EQ(model(), "Quarion Velmira");
    writeImageBut(1, MODEL_OFFSET, 0);
    EXPECT_EQ(model(), "VOXA");
}

// Rules: VEH-13
TEST_F(VehicleIdentityTest, BrandAndModelAreIndependent) {
    setByte(BRAND_OFFSET, 2);
    setByte(MODEL_OFFSET, 1);
    EXPECT_EQ(brand(), "QUARION");
    EXPECT_EQ(model(), "Marl Tulvari");
}

// Rules: VEH-05, VEH-09, VEH-12
TEST_F(VehicleIdentityTest, MissingImageGivesTheDefaults) {
    writeImage(std::string(179, '\x02'));
    remove(IMAGE_PATH);
    expectDefaults();
}

TEST_F(VehicleIdentityTest, EmptyImageGivesTheDefaults) {
    writeImage("");
    expectDefaults();
}

TEST_F(VehicleIdentityTest, ImageThatCannotBeMappedGivesTheDefaults) {
    putFolder(IMAGE_PATH);
    expectDefaults();
}

TEST_F(VehicleIdentityTest, ZerosInTheImageGiveTheDefaults) {
    writeImage(std::string(179, '\0'));
    expectDefaults();
}

TEST_F(VehicleIdentityTest, ShortImageIsReadToTheEndOfItsPage) {
    writeImage(std::string(36, '\x02'));
    EXPECT_EQ(getRightHandDrive(), 2U);
    EXPECT_EQ(brand(), "QUARION");
    EXPECT_EQ(fuelType(), "gasoline");
    EXPECT_EQ(model(), "VOXA");
}

// Rules: IMG-05
TEST_F(VehicleIdentityTest, CalibrationFileDoesNotReplaceTheImage) {
    remove(IMAGE_PATH);
    std::filesystem::create_directories("/fs/rwdata/CALS");
    writeFile("/fs/rwdata/CALS/cal_active.bin", std::string(179, '\x02'));
    expectDefaults();
}

TEST_F(VehicleIdentityTest, EachCallReadsTheImageAgain) {
    writeImage(std::string(179, '\x02'));
    EXPECT_EQ(brand(), "QUARION");
    EXPECT_EQ(fuelType(), "cng");
    remove(IMAGE_PATH);
    expectDefaults();
    writeImage(std::string(179, '\x03'));
    EXPECT_EQ(getRightHandDrive(), 3U);
    EXPECT_EQ(fuelType(), "electric");
}

TEST_F(VehicleIdentityTest, LookupsLeaveNoDescriptorOpen) {
    const int before = openDescriptors();
    for (const char* state : {"whole", "empty", "folder", "missing"}) {
        SCOPED_TRACE(state);
        if (std::string(state) == "empty") {
            writeImage("");
        } else if (std::string(state) == "folder") {
            putFolder(IMAGE_PATH);
        } else if (std::string(state) == "missing") {
            remove(IMAGE_PATH);
        }
        expectDefaults();
        EXPECT_EQ(openDescriptors(), before);
    }
}

TEST_F(VehicleIdentityTest, LookupsLeaveNoMapping) {
    expectDefaults();
    EXPECT_EQ(mappingsOfTheImage(), 0);
}

TEST_F(VehicleIdentityTest, MappingOfAnOpenStoreIsSeen) {
    ConfigStore store;
    ASSERT_EQ(store.open(), 0);
    EXPECT_EQ(mappingsOfTheImage(), 1);
}

} // namespace orvane::test
