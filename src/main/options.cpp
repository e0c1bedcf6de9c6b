// SPDX-License-Identifier: Apache-2.0
#include "main/options.h"

#include "platform/option_parser.h"
#include "writers/airplay_writer.h"
#include "writers/iap_writer.h"

namespace orvane {

namespace {

/// Runs one writer. It throws only if memory runs out where no default can be used: it then ends,
/// as silently as after any other failure, and the next option runs.
void run(Writer writer) {
    try {
        writer();
    } catch (...) { // NOLINT(bugprone-empty-catch) GCOVR_EXCL_LINE
        // Nothing is reported, on purpose. The causes are streams that need memory before they are
        // opened (libc++), and strings that need it even when short (GCC before 5).
    }
}

} // namespace

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

int runOptions(int argc, char* const argv[]) {
    while (const Writer writer = nextWriter(argc, argv)) {
        run(writer);
    }
    return 0;
}

} // namespace orvane
