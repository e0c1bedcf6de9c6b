// SPDX-License-Identifier: Apache-2.0
#include "identity/model_names.h"

#include <string>
#include <string_view>

namespace orvane {

// clang-format off
constexpr std::array<const char*, MODEL_CODE_COUNT> ModelNameTable = {
    "Marl Tulvari",          // 1
    "Marl Ondrix",           // 2
    "Marl Pelluma",          // 3
    "Marl Kestova",          // 4
    "Marl Brenquil",         // 5
    "Marl Ibroskan",         // 6
    "Marl Dunmarra",         // 7
    "Marl Phendrel",         // 8
    "Marl Galvique",         // 9
    "Marl Hodruvin",         // 10
    "Marl Ilvanto",          // 11
    "Marl Jorrimek",         // 12
    "Marl Lumeqa",           // 13
    "Marl Mirrovex",         // 14
    "Marl Nuvantil",         // 15
    "Marl Orsevane",         // 16
    "Marl Prilloq",          // 17
    "Marl Rethiam",          // 18
    "Marl Sovrelle",         // 19
    "Marl Tarnovik",         // 20
    "Marl Umbrenta Tor",     // 21
    "Marl Vesqualo",         // 22
    "Marl Wexhollin",        // 23
    "Marl Yalmeric",         // 24
    "Quarion Drellune",      // 25
    "Quarion Velmira",       // 26
    "Quarion Obrelune",      // 27
    "Quarion Thelwyne",      // 28
    "Quarion Delphume",      // 29
    "Quarion Eskarno",       // 30
    "Marl Orlathin",         // 31
    "Marl Tulvari",          // 32: the name of code 1, on purpose
    "Marl Ghevolyn",         // 33
    "Marl Dosquera",         // 34
    "Marl Uvarneth",         // 35
    "Marl Frumolt Van",      // 36
    "Marl Gessandor",        // 37
    "Marl Hoveric Trek",     // 38
    "Marl Immelza",          // 39
    "Marl Jovelkin",         // 40
    "Marl Kolvenda Cargo",   // 41
    "Marl Lorbasti",         // 42
    "Marl Wendrilo",         // 43
    "Marl Nirquoda",         // 44
    "Marl Ombravel",         // 45
    "Quarion Umbressio",     // 46
    "Marl Quillon",          // 47
};
// clang-format on

namespace {

constexpr std::string_view FIRST_BRAND = "Marl ";
constexpr std::string_view SECOND_BRAND = "Quarion ";

constexpr bool isSecondBrandCode(std::size_t code) {
    return (code >= 25 && code <= 30) || code == 46;
}

constexpr bool namesHaveTheirShape() {
    for (std::size_t code = 1; code <= MODEL_CODE_COUNT; ++code) {
        const std::string_view name = ModelNameTable[code - 1];
        const std::string_view brand = isSecondBrandCode(code) ? SECOND_BRAND : FIRST_BRAND;
        if (name.size() < 7 || name.size() > 20 || name.substr(0, brand.size()) != brand) {
            return false;
        }
    }
    return true;
}

/// Every code has a name of its own, but for code 32, which has that of code 1.
constexpr bool namesDifferButForTheAlias() {
    constexpr std::size_t ALIAS = 32;
    for (std::size_t code = 1; code <= MODEL_CODE_COUNT; ++code) {
        for (std::size_t other = 1; other < code; ++other) {
            const bool isSame =
                std::string_view(ModelNameTable[code - 1]) == ModelNameTable[other - 1];
            if (isSame != (code == ALIAS && other == 1)) {
                return false;
            }
        }
    }
    return true;
}

static_assert(namesHaveTheirShape());
static_assert(namesDifferButForTheAlias());

} // namespace

} // namespace orvane
