// SPDX-License-Identifier: Apache-2.0
#include "tests/support/accepted_outputs.h"

#include "tests/support/unit_test.h"

namespace orvane::test {

const char* const OUTPUT_NAMES[6] = {"telephony_FFFF.txt", "speechrec_FFFF.txt", "airplay.conf",
                                     "iap2_device.cfg",    "iap2.cfg",           "iap1.cfg"};

namespace {

/// A tuning file of an all-zero block.
std::string tuningText(char blockId) {
    return std::string("; Genereated config from DPS (blockId ") + blockId +
           ")\nqwaAECSwitch \nqwaAGCSwitch \nqwaDiagSwitch \nqwaHFESwitch \nqwaMixFiltSwitch \n"
           "qwaMixSwitch \nqwaNRSwitch \nqwaRECSwitch \nqwaRecvAGCSwitch \nqwaRecvBWESwitch \n"
           "qwaRecvDLCSwitch \nqwaRecvDTFSwitch \nqwaRecvENSSwitch \nqwaRecvEQSwitch \n"
           "qwaSendDynEQSwitch \nqwaSendEQSwitch \nqwaWNDBMode \nqwaWNDBSwitch \n"
           "qwaAECFiltLen 0\nqwaLFRSwitch \nqwaHFEExtent 0\nqwaNCParams 0 0 0 0 0 \n"
           "qwaNRAtten 0\nqwaRECSuppress 0\nqwaRecvAGCAmpTgts 0 0 \nqwaRecvAGCGainVals 0 0 0 \n"
           "qwaRecvAGCMaxRates 0 0 \nqwaRecvGain 0\nqwaRecvLimitThresh 0\n"
           "qwaRecvParamEQNodes 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 \nqwaRefDelay 0\n"
           "qwaRefMaxDelay 0\nqwaSendAGCMaxRates 0 0 \nqwaSendAGCAmpTgts 0 0 \n"
           "qwaSendAGCGainVals 0 0 0 \nqwaSendDynEQMinMaxSNR 0 0 \nqwaSendGain 0\n"
           "qwaSendLimitThresh 0\nqwaSendParamEQ2Nodes 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 \n"
           "qwaSendParamEQNodes 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 \nqwaWNDBSuppress 0\n"
           "qwaDNSEnable 0\nqwaIVOSwitch \nqwaMEQEnable 0 0 0 0 \n";
}

std::string airplayText(const std::string& model) {
    return "# Default name of the accessory if a name is not specified in the user prefs.\n"
           "name = CarPlay\n\n# Model of the accessory.\nmodel = " +
           model +
           "\n\n# Manufacturer of the accessory.\nmanufacturer = Marl Motor Company\n\n"
           "# OEM Icon Label\noemIconLabel = VOXA\n\n"
           "# OEM Icon Visibility Setting\noemIconVisible = 1\n\n"
           "# 104x104 OEM Icon png path\noemIconPath = /fs/mp/etc/MARL/oemIcon.png\n\n"
           "# audio profile for QWA\naudioProfile = 65535\n\n"
           "# rightHandDrive mode setting right\nrightHandDrive = 0\n\nairplay template\n";
}

std::string iapText(const std::string& model, const std::string& version, const std::string& rest) {
    return "# This section is mandatory.  Populate all fields with accessory-specific info.\n"
           "[accessory]\nname=VOXA 3\nmodel=" +
           model +
           "\nmanufacturer=Marl Motor Company\nserial=SN004217\nfirmware_version=" + version +
           "\n" + rest;
}

} // namespace

void fillWholeUnit() {
    writeFile("/fs/mp/etc/airplay_static.conf", "airplay template\n");
    writeFile("/fs/mp/etc/iap2_device_static.cfg", "device template\n");
    writeFile("/fs/mp/etc/mm/iap2_static.cfg", "iap2 template\n");
    writeFile("/fs/mp/etc/mm/iap1_static.cfg", "iap1 template\n");
    writeFile("/fs/rwdata/.Version/application.inf",
              std::string("Name = a value that is far too long for a string's own buffer\n"
                          "Type = Application\nVersion Number = ") +
                  LONG_VERSION + "\n");
    std::string image(179, '\0');
    image[133] = image[134] = '\xFF'; // the generated audio profile
    image[139] = 41;                  // LONG_MODEL
    writeFile(IMAGE_PATH, image);
    std::string disk(MEBIBYTE, '\0');
    disk.replace(129, 8, "SN004217");
    writeFile(DISK_PATH, disk);
}

std::set<std::string> acceptedTexts(const std::string& name) {
    const std::string device =
        "hardware_version=1.0.0\n\ndevice template\n\n[vehicle]\nenable=no\n\n";
    const std::string iap2 = "hardware_version=1.0.0\n\niap2 template\n";
    const std::string iap1 = "hardware_version=010000\nrfcert=00000000 \n\niap1 template\n";
    std::set<std::string> texts;
    for (const char* model : {LONG_MODEL, "VOXA"}) {
        if (name == "airplay.conf") {
            texts.insert(airplayText(model));
        } else if (name == "iap1.cfg") {
            texts.insert(iapText(model, "030a02", iap1));
            texts.insert(iapText(model, "000000", iap1));
        } else if (name == "iap2.cfg" || name == "iap2_device.cfg") {
            texts.insert(iapText(model, LONG_VERSION, name == "iap2.cfg" ? iap2 : device));
            texts.insert(iapText(model, "", name == "iap2.cfg" ? iap2 : device));
        } else {
            texts.insert(tuningText(name == "telephony_FFFF.txt" ? '3' : '2'));
        }
    }
    return texts;
}

} // namespace orvane::test
