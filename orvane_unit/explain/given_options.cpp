// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/explain/given_options.h"

#include "platform/option_parser.h"

#include <unistd.h>

#include <utility>

namespace orvane::desk {

namespace {

/// Lets `parse` read the command line from its begin. What the parser prints on standard error is
/// dropped.
template <class Parse>
void parseQuietly(const std::vector<std::string>& arguments, const Parse& parse) {
    std::vector<std::string> words = {"orvane"};
    words.insert(words.end(), arguments.begin(), arguments.end());
    std::vector<char*> argv;
    for (std::string& word : words) {
        argv.push_back(word.data());
    }
    argv.push_back(nullptr);
    const int diagnostics = std::exchange(::opterr, 0);
    ::optind = 0; // forgets the words of an earlier call, too; 1 would not
    parse(static_cast<int>(words.size()), argv.data());
    ::opterr = diagnostics;
}

} // namespace

std::vector<Writer> writersOf(const std::vector<std::string>& arguments) {
    std::vector<Writer> writers;
    parseQuietly(arguments, [&writers](int argc, char* const argv[]) {
        while (const Writer writer = nextWriter(argc, argv)) {
            writers.push_back(writer);
        }
    });
    return writers;
}

std::size_t countUnknownOptions(const std::vector<std::string>& arguments) {
    constexpr int END_OF_OPTIONS = -1;
    constexpr int UNKNOWN = '?';
    std::size_t count = 0;
    parseQuietly(arguments, [&count](int argc, char* const argv[]) {
        int letter = END_OF_OPTIONS;
        while ((letter = platform::nextOption(argc, argv, OPTION_LETTERS)) != END_OF_OPTIONS) {
            count += letter == UNKNOWN ? 1U : 0U;
        }
    });
    return count;
}

} // namespace orvane::desk
