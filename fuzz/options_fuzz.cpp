// SPDX-License-Identifier: Apache-2.0
//
// The command line. The input is the arguments after the program's name, each ended by a NUL as in
// /proc/self/cmdline: at most 32, of at most 64 bytes each, and with at most 16 letters that run a
// writer, since writers take nearly all of the time.
#include "fuzz/support.h"
#include "kit/host/descriptor.h"
#include "kit/host/kit_error.h"
#include "main/options.h"

#include <sys/inotify.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cstdint>
#include <cstring>
#include <filesystem>
#include <iosfwd>
#include <iterator>
#include <string>
#include <string_view>
#include <vector>

namespace orvane::fuzz {

namespace {

constexpr std::size_t MOST_WORDS = 32;
constexpr std::size_t LONGEST_WORD = 64; ///< bytes
constexpr std::ptrdiff_t MOST_WRITERS = 16;
constexpr char PROGRAM_NAME[] = "orvane";
/// The last line of each output, so that an output that is not written to its end shows.
constexpr std::string_view TEMPLATE = "end of template\n";

struct OutputName {
    const char* name;
    const char* templateFile;
};
constexpr OutputName AIRPLAY_FILE = {"airplay.conf", "/fs/mp/etc/airplay_static.conf"};
/// In the order in which they are written.
constexpr std::array<OutputName, 3> IAP_FILES = {
    OutputName{"iap2_device.cfg", "/fs/mp/etc/iap2_device_static.cfg"},
    OutputName{"iap2.cfg", "/fs/mp/etc/mm/iap2_static.cfg"},
    OutputName{"iap1.cfg", "/fs/mp/etc/mm/iap1_static.cfg"},
};

/// A unit with templates and nothing else: every value is a default.
struct Target {
    Unit unit;
    kit::Descriptor events{::inotify_init1(IN_NONBLOCK | IN_CLOEXEC)};

    Target() {
        unit.makeFile(AIRPLAY_FILE.templateFile, TEMPLATE);
        for (const OutputName& file : IAP_FILES) {
            unit.makeFile(file.templateFile, TEMPLATE);
        }
        const std::filesystem::path outputs = unit.hostPath("/tmp");
        std::filesystem::create_directory(outputs);
        // Both, since consecutive equal events become one.
        if (::inotify_add_watch(events.number(), outputs.c_str(), IN_OPEN | IN_CLOSE_WRITE) == -1) {
            throw kit::systemError("cannot watch " + outputs.string());
        }
    }

    /// The names of the files that were closed after writing since the last call, in order, each
    /// followed by a blank.
    std::string takeWritten() const {
        std::string names;
        alignas(inotify_event) std::array<char, 65536> buffer{};
        ssize_t got = 0;
        while ((got = ::read(events.number(), buffer.data(), buffer.size())) > 0) {
            for (ssize_t at = 0; at < got;) {
                inotify_event event{};
                std::memcpy(&event, buffer.data() + at, sizeof event);
                if ((event.mask & IN_CLOSE_WRITE) != 0) {
                    names.append(buffer.data() + at + sizeof event).append(" ");
                }
                at += static_cast<ssize_t>(sizeof event + event.len);
            }
        }
        return names;
    }
};

Target& target() {
    static Target instance;
    return instance;
}

std::ptrdiff_t countWriters(std::string_view word) {
    return std::count(word.begin(), word.end(), 'a') + std::count(word.begin(), word.end(), 'i');
}

std::vector<std::string> wordsOf(std::string_view input) {
    std::vector<std::string> words;
    std::ptrdiff_t writers = 0;
    while (!input.empty() && words.size() < MOST_WORDS) {
        const std::string_view word = take(input, input.find('\0')).substr(0, LONGEST_WORD);
        take(input, 1);
        writers += countWriters(word);
        if (writers > MOST_WRITERS) {
            break;
        }
        words.emplace_back(word);
    }
    return words;
}

/// What a command line must do.
struct Outcome {
    std::string written;     ///< in the form of Target::takeWritten
    std::string diagnostics; ///< a line for each unknown letter, in the C library's words
};

/// POSIX utility syntax guidelines: letters follow a "-", alone or together; "--" or the first
/// operand ends the options; "-" alone is an operand.
Outcome expectedOutcome(const std::vector<std::string>& words) {
    Outcome outcome;
    for (const std::string& word : words) {
        if (word.size() < 2 || word[0] != '-' || word == "--") {
            break;
        }
        for (const char letter : word.substr(1)) {
            if (letter == 'a') {
                outcome.written.append(AIRPLAY_FILE.name).append(" ");
            } else if (letter == 'i') {
                for (const OutputName& file : IAP_FILES) {
                    outcome.written.append(file.name).append(" ");
                }
            } else {
                outcome.diagnostics.append(PROGRAM_NAME).append(": invalid option -- '");
                outcome.diagnostics.append(1, letter).append("'\n");
            }
        }
    }
    return outcome;
}

/// Requires that exactly the written outputs are there, each to its last line, and removes them.
void checkAndRemoveFiles(const std::string& written) {
    const std::filesystem::path folder = target().unit.hostPath("/tmp");
    std::ptrdiff_t count = 0;
    for (const char* name :
         {AIRPLAY_FILE.name, IAP_FILES[0].name, IAP_FILES[1].name, IAP_FILES[2].name}) {
        if (written.find(std::string(name) + " ") != std::string::npos) {
            const std::string content = contentOf(folder / name);
            if (content.find(TEMPLATE) == std::string::npos) {
                fail(name, TEMPLATE, content);
            }
            ++count;
        }
    }
    using Listing = std::filesystem::directory_iterator;
    requireSame("files in /tmp", count, std::distance(Listing(folder), Listing()));
    for (const auto& entry : Listing(folder)) {
        std::filesystem::remove(entry.path());
    }
}

} // namespace

} // namespace orvane::fuzz

extern "C" int LLVMFuzzerInitialize(int* /*argc*/, char*** /*argv*/) {
    orvane::fuzz::target();
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    using namespace orvane::fuzz;
    std::vector<std::string> words = wordsOf(inputText(data, size));
    const Outcome expected = expectedOutcome(words);

    std::string program = PROGRAM_NAME;
    std::vector<char*> arguments = {program.data()};
    for (std::string& word : words) {
        arguments.push_back(word.data());
    }
    const int count = static_cast<int>(arguments.size());
    arguments.push_back(nullptr);

    ::optind = 0; // makes glibc start again, even in the middle of a word
    int status = -1;
    const std::string said =
        target().unit.run([&] { status = orvane::runOptions(count, arguments.data()); });

    requireSame("runOptions", 0, status);
    requireEqual("said", expected.diagnostics, said);
    requireEqual("written, in order", expected.written, target().takeWritten());
    checkAndRemoveFiles(expected.written);
    return 0;
}
