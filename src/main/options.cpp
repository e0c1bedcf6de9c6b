// SPDX-License-Identifier: Apache-2.0
#include "main/options.h"

#include "platform/option_parser.h"
#include "writers/airplay_writer.h"
#include "writers/iap_writer.h"

namespace orvane {

int runOptions(int argc, char* const argv[]) {
    constexpr char OPTION_LETTERS[] = "ia";
    constexpr int END_OF_OPTIONS = -1;
    int letter = END_OF_OPTIONS;
    while ((letter = platform::nextOption(argc, argv, OPTION_LETTERS)) != END_OF_OPTIONS) {
        if (letter == 'a') {
            updateAirplayConfigFile();
        } else if (letter == 'i') {
            updateIapConfigFiles();
        }
    }
    return 0;
}

} // namespace orvane
