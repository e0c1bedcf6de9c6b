// SPDX-License-Identifier: Apache-2.0
#include "main/options.h"

#include "platform/option_parser.h"
#include "writers/airplay_writer.h"
#include "writers/iap_writer.h"

namespace orvane {

Writer nextWriter(int argc, char* const argv[]) {
    constexpr int END_OF_OPTIONS = -1;
    int letter = END_OF_OPTIONS;
    while ((letter = platform::nextOption(argc, argv, OPTION_LETTERS)) != END_OF_OPTIONS) {
        if (letter == AIRPLAY_OPTION) {
            return updateAirplayConfigFile;
        }
        if (letter == IAP_OPTION) {
            return updateIapConfigFiles;
        }
    }
    return nullptr;
}

void runWriter(Writer writer) {
    try {
        writer();
    } catch (...) { // NOLINT(bugprone-empty-catch)
        // Nothing is reported, on purpose. The causes are streams that need memory before they are
        // opened (libc++), and strings that need it even when short (GCC before 5).
    }
}

int runOptions(int argc, char* const argv[]) {
    while (const Writer writer = nextWriter(argc, argv)) {
        runWriter(writer);
    }
    return 0;
}

} // namespace orvane
