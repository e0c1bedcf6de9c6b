// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/explain/reasons.h"

#include "identity/software_version.h"
#include "tuning/audio_profile.h"
#include "writers/iap_writer.h"
#include "writers/template_merge.h"

namespace orvane::desk {

namespace {

// clang-format off
std::array<ReasonInfo, REASON_COUNT> reasonRows() {
    const std::string iap2 = IAP2_FILE.output;
    return {{
        {Reason::generated, "generated", "the generated lines and the whole template are there", true},
        {Reason::profileNotGenerated, "profile-not-generated", "the audio profile is not " + std::to_string(AUDIO_PROFILE_GENERATED) + ", so no tuning file is asked for", true},
        {Reason::profileUnknown, "profile-unknown", "the audio profile can't be read, so no tuning file is asked for", false},
        {Reason::outputNotOpenable, "output-not-openable", "the output can't be opened for writing; what is there stays", false},
        {Reason::templateMissing, "template-missing", "the template can't be opened", false},
        {Reason::templateEmpty, "template-empty", "the template yields no byte, and what would follow it is dropped", false},
        {Reason::iap2NotOpened, "iap2-not-opened", iap2 + " can't be opened, so this file is replaced by its stock file", false},
        {Reason::iap2TemplateEmpty, "iap2-template-empty", "the template of " + iap2 + " yields no byte, so this file is replaced by its stock file", false},
        {Reason::stockMissing, "stock-missing", "the stock file can't be opened, so the output is left empty", false},
        {Reason::stockEmpty, "stock-empty", "the stock file yields no byte, so the output is left empty", false},
        {Reason::fixedText, "fixed-text", "the tool's own text", true},
        {Reason::fromTemplate, "from-template", "the template, byte for byte", true},
        {Reason::fromStock, "from-stock", "the stock file, byte for byte", true},
        {Reason::fromImage, "from-image", "a parameter of the configuration image", true},
        {Reason::imageMissing, "image-missing", "the configuration image can't be opened", false},
        {Reason::imageNotMappable, "image-not-mappable", "the configuration image is empty or not a memory object", false},
        {Reason::imageTooShort, "image-too-short", "the configuration image ends before the parameter, which then reads as zero", false},
        {Reason::modelUnknown, "model-unknown", "no model has this code", false},
        {Reason::fromRecord, "from-record", "a record slot of the boot disk", true},
        {Reason::serialBlank, "serial-blank", "the serial's record begins with a zero byte, so the serial is empty", false},
        {Reason::diskMissing, "disk-missing", "the boot disk can't be opened", false},
        {Reason::diskTooShort, "disk-too-short", "the boot disk is too short to hold the record", false},
        {Reason::diskUnreadable, "disk-unreadable", "the boot disk can't be read", false},
        {Reason::fromVersionFile, "from-version-file", "a version description file", true},
        {Reason::versionFolderMissing, "version-folder-missing", "the folder of the version description files can't be read", false},
        {Reason::versionNoApplication, "version-no-application", std::string("no version description file has a type that contains \"") + APPLICATION_TYPE + "\"", false},
        {Reason::versionNumberMissing, "version-number-missing", "the application has no version number, or nothing after its prefix", false},
        {Reason::versionNotAvailable, "version-not-available", std::string("the application's version is \"") + NO_VERSION + "\"", false},
        {Reason::versionIncomplete, "version-incomplete", "the version has fewer than three components, so the last one is repeated", false},
        {Reason::versionNotNumeric, "version-not-numeric", "a component of the version does not begin with a number, and counts as 0", false},
        {Reason::versionOutOfRange, "version-out-of-range", "a component of the version is not from 0 to 255, so its remainder modulo 256 is used", false},
        {Reason::fromTuningBlock, "from-tuning-block", "a field of a tuning block on the boot disk", true},
        {Reason::wordUnknown, "word-unknown", "the code has no word, so the value is empty", false},
    }};
}
// clang-format on

} // namespace

const std::array<ReasonInfo, REASON_COUNT>& reasons() {
    static const std::array<ReasonInfo, REASON_COUNT> ROWS = reasonRows();
    return ROWS;
}

const ReasonInfo& reasonInfo(Reason reason) {
    return reasons().at(static_cast<std::size_t>(reason));
}

} // namespace orvane::desk
