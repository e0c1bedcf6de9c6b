// SPDX-License-Identifier: Apache-2.0
//
// Every accessory file with every state of its template, its stock file and its output; the last
// file of the iAP writer also with every state of those on which it depends.
#include "tests/product/writers/airplay_unit.h"
#include "tests/product/writers/iap_unit.h"
#include "writers/airplay_writer.h"
#include "writers/iap_writer.h"

#include <filesystem>
#include <string>

namespace orvane::test {
namespace {

enum class State { present, empty, missing, folder };
constexpr unsigned STATE_COUNT = 4;
constexpr unsigned STATES_OF_A_FILE = STATE_COUNT * STATE_COUNT * STATE_COUNT;

struct States {
    State templateFile;
    State stock;
    State output;
};

/// Each `number` below STATES_OF_A_FILE stands for other states.
States statesOf(unsigned number) {
    return {static_cast<State>(number % STATE_COUNT),
            static_cast<State>(number / STATE_COUNT % STATE_COUNT),
            static_cast<State>(number / STATE_COUNT / STATE_COUNT)};
}

/// A file, and the text around its template.
struct File {
    const char* templateFile;
    const char* stock;
    const char* output;
    std::string head;
    std::string tail;
};

/// A template or a stock file holds its own path.
std::string contentOf(const std::string& path) {
    return path + "\n";
}

/// Whether a file is generated that depends on its own template and output.
bool isGenerated(const States& states) {
    return states.templateFile != State::missing && states.output != State::folder;
}

/// A copy that moves no byte leaves the output's stream failed.
bool hasStreamFailed(const States& states) {
    return states.output == State::folder ||
           (isGenerated(states) && states.templateFile != State::present);
}

class EveryOutputStateTest : public IapUnitTest {
protected:
    static void put(const File& file, const States& states) {
        put(file.templateFile, states.templateFile, contentOf(file.templateFile));
        put(file.stock, states.stock, contentOf(file.stock));
        put(file.output, states.output, std::string(1000, 'o')); // longer than any result
    }

    static void expectOutput(const File& file, const States& states, bool isGenerated) {
        if (states.output == State::folder) {
            EXPECT_TRUE(std::filesystem::is_directory(file.output)) << file.output;
            EXPECT_TRUE(std::filesystem::is_empty(file.output)) << file.output;
        } else {
            EXPECT_EQ(readFile(file.output), isGenerated ? generated(file, states.templateFile)
                                                         : installed(file, states.stock))
                << file.output;
        }
    }

    /// Runs `writer` with every state of a file that depends on nothing else.
    template <class Writer>
    static void expectEveryState(const File& file, const Writer& writer) {
        for (unsigned number = 0; number < STATES_OF_A_FILE && !HasFailure(); ++number) {
            SCOPED_TRACE(number);
            const States states = statesOf(number);
            put(file, states);
            EXPECT_EQ(writer(), 0);
            expectOutput(file, states, isGenerated(states));
        }
    }

private:
    static void put(const std::string& path, State state, const std::string& content) {
        remove(path);
        if (state == State::folder) {
            std::filesystem::create_directory(path);
        } else if (state != State::missing) {
            writeFile(path, state == State::present ? content : "");
        }
    }

    /// Without a byte of the template, nothing follows the head.
    static std::string generated(const File& file, State templateFile) {
        return templateFile == State::present ? file.head + contentOf(file.templateFile) + file.tail
                                              : file.head;
    }

    static std::string installed(const File& file, State stock) {
        return stock == State::present ? contentOf(file.stock) : "";
    }
};

TEST_F(EveryOutputStateTest, OfTheAirplayFile) {
    expectEveryState({AIRPLAY_TEMPLATE, AIRPLAY_STOCK, AIRPLAY_OUTPUT, plainAirplayHead(), ""},
                     updateAirplayConfigFile);
}

TEST_F(EveryOutputStateTest, OfTheIap2DeviceFile) {
    expectEveryState({DEVICE_TEMPLATE, DEVICE_STOCK, DEVICE_OUTPUT, iap2Head(), DEVICE_TAIL},
                     updateIapConfigFiles);
}

/// The iAP1 file asks for the stream of the iAP2 file, and not for its own template.
TEST_F(EveryOutputStateTest, OfTheIap2FileWithThoseOfTheIap1File) {
    const File iap2 = {IAP2_TEMPLATE, IAP2_STOCK, IAP2_OUTPUT, iap2Head(), ""};
    const File iap1 = {IAP1_TEMPLATE, IAP1_STOCK, IAP1_OUTPUT, iap1Head(), ""};
    for (unsigned number = 0; number < STATES_OF_A_FILE * STATES_OF_A_FILE; ++number) {
        const States iap2States = statesOf(number / STATES_OF_A_FILE);
        const States iap1States = statesOf(number % STATES_OF_A_FILE);
        put(iap2, iap2States);
        put(iap1, iap1States);
        EXPECT_EQ(updateIapConfigFiles(), 0);
        expectOutput(iap2, iap2States, isGenerated(iap2States));
        expectOutput(iap1, iap1States,
                     !hasStreamFailed(iap2States) && iap1States.output != State::folder);
        ASSERT_FALSE(HasFailure()) << "states " << number;
    }
}

} // namespace
} // namespace orvane::test
