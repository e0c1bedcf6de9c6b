// SPDX-License-Identifier: Apache-2.0
//
// Units that give every reason, and ways to change a unit.
#pragma once

#include "config/boot_disk.h"
#include "config/config_store.h"
#include "kit/description/unit_description.h"
#include "orvane_unit/explain/explanation.h"
#include "orvane_unit/explain/reasons.h"
#include "tuning/audio_profile.h"
#include "writers/airplay_writer.h"
#include "writers/iap_writer.h"

#include <functional>
#include <string>
#include <vector>

namespace orvane::test {

constexpr char VERSION_FILE[] = "/fs/rwdata/.Version/app.inf";

/// A unit that gives a reason.
struct ReasonUnit {
    desk::Reason reason;
    const char* output; ///< where the reason is expected
    desk::Outcome outcome;
    std::function<void(kit::UnitDescription&)> change;
};

inline std::function<void(kit::UnitDescription&)> without(const std::string& path) {
    return [path](kit::UnitDescription& unit) {
        unit.files.erase(path);
        unit.absent.push_back(path);
    };
}

inline std::function<void(kit::UnitDescription&)> empty(const std::string& path) {
    return [path](kit::UnitDescription& unit) { unit.files[path].clear(); };
}

inline std::function<void(kit::UnitDescription&)> folder(const std::string& path) {
    return [path](kit::UnitDescription& unit) {
        unit.files.erase(path);
        unit.folders.push_back(path);
    };
}

inline std::function<void(kit::UnitDescription&)> version(const std::string& text) {
    return [text](kit::UnitDescription& unit) {
        unit.files[VERSION_FILE] = "Type=Application\nVersion Number=" + text + "\n";
    };
}

inline std::function<void(kit::UnitDescription&)>
both(const std::function<void(kit::UnitDescription&)>& first,
     const std::function<void(kit::UnitDescription&)>& second) {
    return [first, second](kit::UnitDescription& unit) {
        first(unit);
        second(unit);
    };
}

inline void plain(kit::UnitDescription& /*unit*/) {}

inline void generatedProfile(kit::UnitDescription& unit) {
    unit.image.params[134] = 0xFFFF;
    unit.disk.tuning[3].fields["qwaAECSwitch"] = std::string("qwaOn");
}

/// At least one for each reason.
inline const std::vector<ReasonUnit>& reasonUnits() {
    using desk::Outcome;
    using desk::Reason;
    constexpr const char* AIRPLAY_OUT = AIRPLAY_FILE.output;
    constexpr const char* DEVICE_OUT = IAP2_DEVICE_FILE.output;
    constexpr const char* IAP1_OUT = IAP1_FILE.output;
    static const std::vector<ReasonUnit> ROWS = {
        {Reason::generated, AIRPLAY_OUT, Outcome::generated, plain},
        {Reason::profileNotGenerated, TELEPHONY_TUNING_FILE, Outcome::notAsked, plain},
        {Reason::profileUnknown, SPEECHREC_TUNING_FILE, Outcome::notAsked,
         without(CONFIG_SHM_NAME)},
        {Reason::outputNotOpenable, DEVICE_OUT, Outcome::kept, folder(DEVICE_OUT)},
        {Reason::templateMissing, AIRPLAY_OUT, Outcome::stock, without(AIRPLAY_FILE.templateFile)},
        {Reason::templateMissing, IAP1_OUT, Outcome::generated, without(IAP1_FILE.templateFile)},
        {Reason::templateEmpty, DEVICE_OUT, Outcome::generated,
         empty(IAP2_DEVICE_FILE.templateFile)},
        {Reason::templateEmpty, DEVICE_OUT, Outcome::generated,
         folder(IAP2_DEVICE_FILE.templateFile)},
        {Reason::iap2NotOpened, IAP1_OUT, Outcome::stock, folder(IAP2_FILE.output)},
        {Reason::iap2TemplateEmpty, IAP1_OUT, Outcome::stock, empty(IAP2_FILE.templateFile)},
        {Reason::stockMissing, AIRPLAY_OUT, Outcome::empty,
         both(without(AIRPLAY_FILE.templateFile), without(AIRPLAY_FILE.stockFile))},
        {Reason::stockEmpty, AIRPLAY_OUT, Outcome::empty,
         both(without(AIRPLAY_FILE.templateFile), empty(AIRPLAY_FILE.stockFile))},
        {Reason::fixedText, AIRPLAY_OUT, Outcome::generated, plain},
        {Reason::fromTemplate, AIRPLAY_OUT, Outcome::generated, plain},
        {Reason::fromStock, AIRPLAY_OUT, Outcome::stock, without(AIRPLAY_FILE.templateFile)},
        {Reason::fromImage, AIRPLAY_OUT, Outcome::generated, plain},
        {Reason::imageMissing, AIRPLAY_OUT, Outcome::generated, without(CONFIG_SHM_NAME)},
        {Reason::imageNotMappable, AIRPLAY_OUT, Outcome::generated, folder(CONFIG_SHM_NAME)},
        {Reason::imageNotMappable, AIRPLAY_OUT, Outcome::generated,
         [](kit::UnitDescription& unit) {
             unit.image = {};
             unit.image.size = 0;
         }},
        {Reason::imageTooShort, AIRPLAY_OUT, Outcome::generated,
         [](kit::UnitDescription& unit) {
             unit.image = {};
             unit.image.size = 134; // half of the audio profile
         }},
        {Reason::modelUnknown, DEVICE_OUT, Outcome::generated,
         [](kit::UnitDescription& unit) { unit.image.params[139] = 48; }},
        {Reason::fromRecord, DEVICE_OUT, Outcome::generated, plain},
        {Reason::serialBlank, DEVICE_OUT, Outcome::generated,
         [](kit::UnitDescription& unit) { unit.disk.slots.clear(); }},
        {Reason::diskMissing, DEVICE_OUT, Outcome::generated, without(BOOT_DISK)},
        {Reason::diskTooShort, DEVICE_OUT, Outcome::generated,
         [](kit::UnitDescription& unit) {
             unit.disk = {};
             unit.disk.size = 5000;
         }},
        {Reason::diskUnreadable, DEVICE_OUT, Outcome::generated, folder(BOOT_DISK)},
        {Reason::fromVersionFile, DEVICE_OUT, Outcome::generated, plain},
        {Reason::versionFolderMissing, DEVICE_OUT, Outcome::generated,
         both(without(VERSION_FILE), without("/fs/rwdata/.Version"))},
        {Reason::versionNoApplication, DEVICE_OUT, Outcome::generated, without(VERSION_FILE)},
        {Reason::versionNumberMissing, IAP1_OUT, Outcome::generated, version("ABC_")},
        {Reason::versionNotAvailable, IAP1_OUT, Outcome::generated, version("N/A")},
        {Reason::versionIncomplete, IAP1_OUT, Outcome::generated, version("1.2")},
        {Reason::versionNotNumeric, IAP1_OUT, Outcome::generated, version("1.b.3")},
        {Reason::versionOutOfRange, IAP1_OUT, Outcome::generated, version("1.256.3")},
        {Reason::fromTuningBlock, TELEPHONY_TUNING_FILE, Outcome::generated, generatedProfile},
        {Reason::wordUnknown, TELEPHONY_TUNING_FILE, Outcome::generated, generatedProfile},
    };
    return ROWS;
}

} // namespace orvane::test
