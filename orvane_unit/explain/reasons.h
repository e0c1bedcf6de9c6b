// SPDX-License-Identifier: Apache-2.0
//
// Why an output, or a line of one, is what it is: one list of codes. A code, once published, keeps
// its meaning; docs/orvane-unit.md lists them all.
#pragma once

#include <array>
#include <cstddef>
#include <string>

namespace orvane::desk {

enum class Reason {
    // of an output
    generated,
    profileNotGenerated,
    profileUnknown,
    outputNotOpenable,
    templateMissing,
    templateEmpty,
    iap2NotOpened,
    iap2TemplateEmpty,
    stockMissing,
    stockEmpty,
    // of a line
    fixedText,
    fromTemplate,
    fromStock,
    fromImage,
    imageMissing,
    imageNotMappable,
    imageTooShort,
    modelUnknown,
    fromRecord,
    serialBlank,
    diskMissing,
    diskTooShort,
    diskUnreadable,
    fromVersionFile,
    versionFolderMissing,
    versionNoApplication,
    versionNumberMissing,
    versionNotAvailable,
    versionIncomplete,
    versionNotNumeric,
    versionOutOfRange,
    fromTuningBlock,
    wordUnknown,
};

constexpr std::size_t REASON_COUNT = static_cast<std::size_t>(Reason::wordUnknown) + 1;

struct ReasonInfo {
    Reason reason;
    const char* code;     ///< stable, for programs
    std::string sentence; ///< for people, without a full stop
    bool isIntended;      ///< no fallback or default is used
};

/// All reasons, in the order of the enumeration.
const std::array<ReasonInfo, REASON_COUNT>& reasons();

const ReasonInfo& reasonInfo(Reason reason);

} // namespace orvane::desk
