// SPDX-License-Identifier: Apache-2.0
//
// Whole runs do their file operations in order, and leave nothing open.
#include "tests/support/trace.h"
#include "tests/support/unit_test.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstddef>
#include <string>
#include <vector>

namespace orvane::test {

namespace {

using Operations = std::vector<std::string>;

/// One operation a line, so that a failure shows the difference by lines.
std::string lines(const Operations& operations) {
    std::string text;
    for (const std::string& operation : operations) {
        text += operation + "\n";
    }
    return text;
}

/// One write.
std::string put(const std::string& path, const std::string& text) {
    return "put " + path + " " + std::to_string(text.size());
}

const std::string AIRPLAY = "/tmp/airplay.conf";
const std::string AIRPLAY_TEMPLATE = "/fs/mp/etc/airplay_static.conf";
const std::string AIRPLAY_STOCK = "/fs/mp/etc/airplay.conf";

void append(Operations& operations, const Operations& more) {
    operations.insert(operations.end(), more.begin(), more.end());
}

/// The bytes that one lookup maps. An emulator asks its own system for whole pages.
const std::string MAPPED_BYTES = sizeof ORVANE_EMULATOR == 1 ? "179" : "4096";

/// One lookup of a parameter: its own descriptor and its own mapping, both released.
Operations lookup() {
    const std::string image = IMAGE_PATH;
    return {"read " + image,
            "seek " + image + " 0 SEEK_SET",
            "seek " + image + " 0 SEEK_END",
            "seek " + image + " 0 SEEK_SET",
            "map " + image + " " + MAPPED_BYTES,
            "unmap " + image,
            "close " + image};
}

Operations diskRead(const std::string& offset, const std::string& length) {
    return {"read /dev/hd0", "seek /dev/hd0 " + offset + " SEEK_END", "get /dev/hd0 " + length,
            "close /dev/hd0"};
}

/// One tuning file of an all-zero block: the disk first, then a write for each line.
Operations tuningFile(const std::string& path, const std::string& text) {
    Operations operations = diskRead("-1044480", "1880");
    operations.push_back("create " + path);
    for (std::size_t begin = 0; begin < text.size();) {
        const std::size_t end = text.find('\n', begin) + 1;
        operations.push_back("put " + path + " " + std::to_string(end - begin));
        begin = end;
    }
    operations.push_back("close " + path);
    return operations;
}

Operations versionScan() {
    return {"list /fs/rwdata/.Version/", "read /fs/rwdata/.Version/app.inf",
            "close /fs/rwdata/.Version/app.inf", "close /fs/rwdata/.Version/"};
}

/// The serial, the model, the version, and the unused fuel type.
Operations iapValues() {
    Operations operations = diskRead("-1048447", "8");
    append(operations, lookup());
    append(operations, versionScan());
    append(operations, lookup());
    return operations;
}

/// A file that fits into the stream's buffer: written when it is closed, after the template.
Operations generated(const std::string& output, const std::string& templateFile,
                     const std::string& text) {
    return {"create " + output, "read " + templateFile, "close " + templateFile, put(output, text),
            "close " + output};
}

Operations stock(const std::string& output, const std::string& templateFile,
                 const std::string& stockFile) {
    return {"create " + output,   "read " + templateFile + " failed",
            "read " + stockFile,  "create " + output,
            "close " + stockFile, put(output, "stock\n"),
            "close " + output};
}

std::string accessoryBlock(const std::string& version) {
    return "# This section is mandatory.  Populate all fields with accessory-specific info.\n"
           "[accessory]\nname=VOXA 3\nmodel=VOXA\nmanufacturer=Marl Motor Company\nserial=\n"
           "firmware_version=" +
           version + "\n";
}

std::string iap1Text() {
    return accessoryBlock("010203") +
           "hardware_version=010000\nrfcert=00000000 \n\niap1 template\n";
}

class TraceTest : public UnitTest {
protected:
    TraceTest() {
        writeFile(AIRPLAY_TEMPLATE, "template\n");
        writeFile(AIRPLAY_STOCK, "stock\n");
        writeFile("/fs/mp/etc/iap2_device_static.cfg", "device template\n");
        writeFile("/fs/mp/etc/mm/iap2_static.cfg", "iap2 template\n");
        writeFile("/fs/mp/etc/mm/iap1_static.cfg", "iap1 template\n");
        for (const char* name : {"iap2_device.cfg", "mm/iap2.cfg", "mm/iap1.cfg"}) {
            writeFile(std::string("/fs/mp/etc/") + name, "stock\n");
        }
        writeFile("/fs/rwdata/.Version/app.inf", "Type=Application\nVersion Number=1.2.3\n");
    }

    Trace run(const std::string& option) {
        leave();
        return traceRun(hostRoot(), {option});
    }
};

// Rules: IMG-10, MRG-01
TEST_F(TraceTest, AirplayGathersThenWritesAndFlushesTheLastLines) {
    setImage(133, {3, 0});
    Operations expected;
    for (int value = 0; value < 4; ++value) { // model, brand, drive side, audio profile
        append(expected, lookup());
    }
    const std::string head =
        "# Default name of the accessory if a name is not specified in the user prefs.\n"
        "name = CarPlay\n\n# Model of the accessory.\nmodel = VOXA\n\n"
        "# Manufacturer of the accessory.\nmanufacturer = Marl Motor Company\n\n"
        "# OEM Icon Label\noemIconLabel = VOXA\n\n"
        "# OEM Icon Visibility Setting\noemIconVisible = 1\n\n"
        "# 104x104 OEM Icon png path\noemIconPath = /fs/mp/etc/MARL/oemIcon.png\n\n"
        "# audio profile for QWA\n";
    append(expected, {
                         "create " + AIRPLAY,
                         "read " + AIRPLAY_TEMPLATE,
                         put(AIRPLAY, head),
                         put(AIRPLAY, "audioProfile = 3\n"),
                         put(AIRPLAY, "\n"),
                         put(AIRPLAY, "# rightHandDrive mode setting right\n"),
                         put(AIRPLAY, "rightHandDrive = 0\n"),
                         put(AIRPLAY, "\n"),
                         "close " + AIRPLAY_TEMPLATE,
                         put(AIRPLAY, "template\n"),
                         "close " + AIRPLAY,
                     });
    const Trace trace = run("-a");
    EXPECT_EQ(lines(trace.operations), lines(expected));
    EXPECT_EQ(trace.leftOpen, Operations());
}

// Rules: PRO-06, TUN-07
TEST_F(TraceTest, GeneratedProfileWritesBothTuningFilesBeforeAirplayIsOpened) {
    setImage(133, "\xFF\xFF");
    const Trace trace = run("-a");
    Operations expected;
    for (int value = 0; value < 4; ++value) {
        append(expected, lookup());
    }
    const std::string tmp = (hostRoot() / "tmp").string();
    append(expected, tuningFile("/tmp/telephony_FFFF.txt", readFile(tmp + "/telephony_FFFF.txt")));
    append(expected, tuningFile("/tmp/speechrec_FFFF.txt", readFile(tmp + "/speechrec_FFFF.txt")));
    expected.push_back("create " + AIRPLAY);
    EXPECT_EQ(lines(trace.operations).substr(0, lines(expected).size()), lines(expected));
    EXPECT_EQ(expected.size(), 4U * 7U + 2U * (4U + 1U + 45U + 1U) + 1U);
    EXPECT_EQ(trace.leftOpen, Operations());
}

TEST_F(TraceTest, AirplayFallbackOpensTheOutputTwice) {
    remove(IMAGE_PATH);
    remove(AIRPLAY_TEMPLATE);
    const std::string noImage = std::string("read ") + IMAGE_PATH + " failed";
    const Trace trace = run("-a");
    EXPECT_EQ(lines(trace.operations), lines({
                                           noImage,
                                           noImage,
                                           noImage,
                                           noImage,
                                           "create " + AIRPLAY,
                                           "read " + AIRPLAY_TEMPLATE + " failed",
                                           "read " + AIRPLAY_STOCK,
                                           "create " + AIRPLAY,
                                           "close " + AIRPLAY_STOCK,
                                           put(AIRPLAY, "stock\n"),
                                           "close " + AIRPLAY,
                                           "close " + AIRPLAY,
                                       }));
    EXPECT_EQ(trace.leftOpen, Operations());
}

// Rules: IMG-05
TEST_F(TraceTest, CalibrationFileIsNeverOpened) {
    remove(IMAGE_PATH);
    putFolder("/fs/rwdata/CALS");
    writeFile("/fs/rwdata/CALS/cal_active.bin", std::string(179, '\1'));
    const Operations operations = run("-a").operations;
    const std::string noImage = std::string("read ") + IMAGE_PATH + " failed";
    EXPECT_EQ(std::count(operations.begin(), operations.end(), noImage), 4);
    for (const std::string& operation : operations) {
        EXPECT_EQ(operation.find("CALS"), std::string::npos) << operation;
    }
}

// Rules: IMG-10, MRG-01, IAP-01, IAP-03, IAP-04, IAP-16
TEST_F(TraceTest, IapRunsItsStagesInOrderAndScansTheVersionsTwice) {
    Operations expected = iapValues();
    const std::string device = "/tmp/iap2_device.cfg";
    append(expected,
           {
               "create " + device,
               "read /fs/mp/etc/iap2_device_static.cfg",
               // Flushed: see generateIap2DeviceFile.
               put(device, accessoryBlock("1.2.3") + "hardware_version=1.0.0\n\ndevice template\n"),
               "close /fs/mp/etc/iap2_device_static.cfg",
               put(device, "\n[vehicle]\nenable=no\n\n"),
               "close " + device,
           });
    append(expected,
           generated("/tmp/iap2.cfg", "/fs/mp/etc/mm/iap2_static.cfg",
                     accessoryBlock("1.2.3") + "hardware_version=1.0.0\n\niap2 template\n"));
    append(expected, versionScan());
    append(expected, generated("/tmp/iap1.cfg", "/fs/mp/etc/mm/iap1_static.cfg", iap1Text()));
    const Trace trace = run("-i");
    EXPECT_EQ(lines(trace.operations), lines(expected));
    EXPECT_EQ(trace.leftOpen, Operations());
}

TEST_F(TraceTest, IapFallbacksKeepTheirStreamsOpenUntilTheEnd) {
    remove("/fs/mp/etc/iap2_device_static.cfg");
    remove("/fs/mp/etc/mm/iap2_static.cfg");
    Operations expected = iapValues();
    append(expected, stock("/tmp/iap2_device.cfg", "/fs/mp/etc/iap2_device_static.cfg",
                           "/fs/mp/etc/iap2_device.cfg"));
    append(expected,
           stock("/tmp/iap2.cfg", "/fs/mp/etc/mm/iap2_static.cfg", "/fs/mp/etc/mm/iap2.cfg"));
    append(expected, versionScan());
    append(expected, generated("/tmp/iap1.cfg", "/fs/mp/etc/mm/iap1_static.cfg", iap1Text()));
    append(expected, {"close /tmp/iap2.cfg", "close /tmp/iap2_device.cfg"});
    const Trace trace = run("-i");
    EXPECT_EQ(lines(trace.operations), lines(expected));
    EXPECT_EQ(trace.leftOpen, Operations());
}

// Rules: OPT-06
TEST_F(TraceTest, WithoutOptionsNothingIsTouched) {
    leave();
    EXPECT_EQ(traceRun(hostRoot(), {}).operations, Operations());
}

} // namespace

} // namespace orvane::test
