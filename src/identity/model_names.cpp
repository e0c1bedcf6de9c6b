// SPDX-License-Identifier: Apache-2.0
#include "identity/model_names.h"

namespace orvane {

// clang-format off
constexpr std::array<const char*, MODEL_CODE_COUNT> ModelNameTable = {{
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
}};
// clang-format on

bool hasModelName(std::uint8_t code) {
    return code >= 1 && code <= MODEL_CODE_COUNT;
}

} // namespace orvane
