// SPDX-License-Identifier: Apache-2.0
#include "main/options.h"

#include "platform/option_parser.h"
#include "writers/airplay_writer.h"
#include "writers/iap_writer.h"

namespace orvane {

namespace {

/// Runs one writer. All that can come out of one is that memory ran out where no default stands in:
/// the writer ends there, as silently as after any other failure, and the next option runs.
void run(Writer writer) {
    try {
        writer();
    } catch (...) { // NOLINT(bugprone-empty-catch) GCOVR_EXCL_LINE
        // Nothing is reported, on purpose. What leads here are streams that need memory before
        // they are opened (libc++), and strings that need it however short they are (GCC before 5).
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
