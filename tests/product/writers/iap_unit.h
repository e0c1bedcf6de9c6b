// SPDX-License-Identifier: Apache-2.0
//
// A unit with the product data of the three iAP files, and the expected content of those files.
#pragma once

#include "tests/support/unit_test.h"

#include <string>

namespace orvane::test {

constexpr char DEVICE_OUTPUT[] = "/tmp/iap2_device.cfg";
constexpr char DEVICE_TEMPLATE[] = "/fs/mp/etc/iap2_device_static.cfg";
constexpr char DEVICE_STOCK[] = "/fs/mp/etc/iap2_device.cfg";
constexpr char IAP2_OUTPUT[] = "/tmp/iap2.cfg";
constexpr char IAP2_TEMPLATE[] = "/fs/mp/etc/mm/iap2_static.cfg";
constexpr char IAP2_STOCK[] = "/fs/mp/etc/mm/iap2.cfg";
constexpr char IAP1_OUTPUT[] = "/tmp/iap1.cfg";
constexpr char IAP1_TEMPLATE[] = "/fs/mp/etc/mm/iap1_static.cfg";
constexpr char IAP1_STOCK[] = "/fs/mp/etc/mm/iap1.cfg";
constexpr char VERSION_FILE[] = "/fs/rwdata/.Version/application.inf";

/// Bytes from the serial's record slot to the end of the disk.
constexpr std::uint64_t SERIAL_FROM_END = MEBIBYTE - 129;

/// The variable values of the accessory block, as IapUnitTest sets them up.
struct IapValues {
    std::string model = "VOXA";
    std::string serial = "SN004217";
    std::string firmware = "3.10.2";
};

inline std::string accessoryBlock(const IapValues& values) {
    return "# This section is mandatory.  Populate all fields with accessory-specific info.\n"
           "[accessory]\n"
           "name=VOXA 3\n"
           "model=" +
           values.model +
           "\n"
           "manufacturer=Marl Motor Company\n"
           "serial=" +
           values.serial +
           "\n"
           "firmware_version=" +
           values.firmware + "\n";
}

/// The text before the template in each file.
inline std::string iap2Head(const IapValues& values = {}) {
    return accessoryBlock(values) + "hardware_version=1.0.0\n"
                                    "\n";
}
inline std::string iap1Head(const IapValues& values = {"VOXA", "SN004217", "030a02"}) {
    return accessoryBlock(values) + "hardware_version=010000\n"
                                    "rfcert=00000000 \n"
                                    "\n";
}

/// The text after the template of the device file.
constexpr char DEVICE_TAIL[] = "\n"
                               "[vehicle]\n"
                               "enable=no\n"
                               "\n";

/// A unit that has all templates and stock files, a serial and a version; its model code is 0.
class IapUnitTest : public UnitTest {
protected:
    IapUnitTest() {
        writeFile(DEVICE_TEMPLATE, "device=1\n");
        writeFile(DEVICE_STOCK, "device stock\n");
        writeFile(IAP2_TEMPLATE, "iap2=1\n");
        writeFile(IAP2_STOCK, "iap2 stock\n");
        writeFile(IAP1_TEMPLATE, "iap1=1\n");
        writeFile(IAP1_STOCK, "iap1 stock\n");
        setDiskFromEnd(SERIAL_FROM_END, "SN004217");
        setVersion("3.10.2");
    }

    static void setVersion(const std::string& text) {
        writeFile(VERSION_FILE, "Type=Application\nVersion Number=" + text + "\n");
    }

    // The three files of this unit, generated.
    static std::string plainDevice() { return iap2Head() + "device=1\n" + DEVICE_TAIL; }
    static std::string plainIap2() { return iap2Head() + "iap2=1\n"; }
    static std::string plainIap1() { return iap1Head() + "iap1=1\n"; }
};

} // namespace orvane::test
