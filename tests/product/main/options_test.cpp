// SPDX-License-Identifier: Apache-2.0
#include "main/options.h"
#include "tests/product/writers/airplay_unit.h"
#include "tests/product/writers/iap_unit.h"
#include "tests/support/folder_names.h"
#include "tests/support/standard_streams.h"

#include <unistd.h>

#include <algorithm>
#include <filesystem>
#include <new>
#include <set>
#include <string>
#include <vector>

namespace orvane::test {

namespace {

const std::set<std::string> NOTHING;
const std::set<std::string> AIRPLAY_FILE{"airplay.conf"};
const std::set<std::string> IAP_FILES{"iap1.cfg", "iap2.cfg", "iap2_device.cfg"};
const std::set<std::string> ALL_FILES{"airplay.conf", "iap1.cfg", "iap2.cfg", "iap2_device.cfg"};

class OptionsTest : public IapUnitTest {
protected:
    OptionsTest() {
        writeFile(AIRPLAY_TEMPLATE, "static = 1\n");
        writeFile(AIRPLAY_STOCK, "stock = 1\n");
    }

    /// Runs the program's options with these arguments, expects the result 0, and returns what was
    /// printed.
    static std::string run(std::vector<std::string> arguments) {
        arguments.insert(arguments.begin(), "orvane");
        std::vector<char*> pointers;
        for (std::string& argument : arguments) {
            pointers.push_back(argument.data());
        }
        pointers.push_back(nullptr);
        const std::vector<char*> asGiven = pointers;
        optind = 0; // makes glibc's getopt start again
        StandardStreams streams;
        const int result = runOptions(static_cast<int>(arguments.size()), pointers.data());
        std::string said = streams.stop();
        EXPECT_EQ(result, 0);
        EXPECT_EQ(pointers, asGiven) << "arguments moved";
        return said;
    }

    /// Runs with these arguments in an empty output folder and expects these names in it.
    static std::string expectFiles(const std::vector<std::string>& arguments,
                                   const std::set<std::string>& names) {
        putFolder("/tmp");
        std::string said = run(arguments);
        std::string echo;
        for (const std::string& argument : arguments) {
            echo += " '" + argument + "'";
        }
        EXPECT_EQ(folderNames("/tmp"), names) << "arguments:" << echo;
        return said;
    }
};

} // namespace

// Rules: OPT-06
TEST_F(OptionsTest, NoOptionsDoNothing) {
    EXPECT_EQ(expectFiles({}, NOTHING), "");
}

// Rules: OPT-01
TEST_F(OptionsTest, LetterARunsTheAirplayWriter) {
    EXPECT_EQ(expectFiles({"-a"}, AIRPLAY_FILE), "");
    EXPECT_EQ(readFile(AIRPLAY_OUTPUT), plainAirplayHead() + "static = 1\n");
}

// Rules: OPT-02
TEST_F(OptionsTest, LetterIRunsTheIapWriter) {
    EXPECT_EQ(expectFiles({"-i"}, IAP_FILES), "");
    EXPECT_EQ(readFile(DEVICE_OUTPUT), plainDevice());
    EXPECT_EQ(readFile(IAP2_OUTPUT), plainIap2());
    EXPECT_EQ(readFile(IAP1_OUTPUT), plainIap1());
}

// Rules: OPT-04
TEST_F(OptionsTest, BothLettersRunBothWriters) {
    for (const std::vector<std::string>& arguments :
         std::vector<std::vector<std::string>>{{"-ai"}, {"-ia"}, {"-a", "-i"}, {"-i", "-a"}}) {
        EXPECT_EQ(expectFiles(arguments, ALL_FILES), "");
        EXPECT_EQ(readFile(AIRPLAY_OUTPUT), plainAirplayHead() + "static = 1\n");
        EXPECT_EQ(readFile(IAP1_OUTPUT), plainIap1());
    }
}

// Rules: OPT-03
TEST_F(OptionsTest, WritersRunInTheOrderOfTheLetters) {
    // Two outputs are one file, so that the last writer's content stays.
    std::filesystem::create_symlink(IAP1_OUTPUT, AIRPLAY_OUTPUT);
    for (const std::vector<std::string>& airplayFirst :
         std::vector<std::vector<std::string>>{{"-ai"}, {"-a", "-i"}, {"-iai"}}) {
        run(airplayFirst);
        EXPECT_EQ(readFile(IAP1_OUTPUT), plainIap1()) << airplayFirst.front();
    }
    for (const std::vector<std::string>& iapFirst :
         std::vector<std::vector<std::string>>{{"-ia"}, {"-i", "-a"}, {"-aia"}}) {
        run(iapFirst);
        EXPECT_EQ(readFile(IAP1_OUTPUT), plainAirplayHead() + "static = 1\n") << iapFirst.front();
    }
}

// Rules: RUN-14, OPT-05
TEST_F(OptionsTest, RepeatedLetterARunsItsWriterAgain) {
    for (const std::vector<std::string>& arguments :
         std::vector<std::vector<std::string>>{{"-aa"}, {"-a", "-a"}}) {
        // The output is the image, so that the second run reads its values from the text of the
        // first: the drive side from a blank, the profile from a line end and a '#'.
        writeImage(std::string(179, '\0'));
        remove(AIRPLAY_OUTPUT);
        std::filesystem::create_symlink(IMAGE_PATH, AIRPLAY_OUTPUT);
        EXPECT_EQ(run(arguments), "");
        AirplayValues values;
        values.profile = profileLines("8970");
        values.driveSide = "32";
        EXPECT_EQ(readFile(IMAGE_PATH), airplayHead(values) + "static = 1\n");
    }
}

// Rules: RUN-14, OPT-05
TEST_F(OptionsTest, RepeatedLetterIRunsItsWriterAgain) {
    for (const std::vector<std::string>& arguments :
         std::vector<std::vector<std::string>>{{"-ii"}, {"-i", "-i"}}) {
        // One output is the version file, so that the second run finds the text of the first there.
        setVersion("1.2.3");
        remove(IAP2_OUTPUT);
        std::filesystem::create_symlink(VERSION_FILE, IAP2_OUTPUT);
        writeFile(IAP2_TEMPLATE, "Type=Application\nVersion Number=9.9.9\n");
        EXPECT_EQ(run(arguments), "");
        EXPECT_EQ(readFile(DEVICE_OUTPUT),
                  iap2Head({"VOXA", "SN004217", "9.9.9"}) + "device=1\n" + DEVICE_TAIL);
    }
}

// Rules: OPT-08
TEST_F(OptionsTest, UnknownLetterIsNamedByTheLibrary) {
    const std::string said = expectFiles({"-x"}, NOTHING);
    EXPECT_EQ(said.rfind("orvane: ", 0), 0U) << said;
    EXPECT_NE(said.find('x', 8), std::string::npos) << said;
    EXPECT_EQ(std::count(said.begin(), said.end(), '\n'), 1) << said;
    EXPECT_EQ(said.find("Usage"), std::string::npos) << said;
}

// Rules: OPT-08, OPT-10
TEST_F(OptionsTest, EveryOtherCharacterIsUnknown) {
    for (char letter = '!'; letter <= '~'; ++letter) {
        if (letter == 'a' || letter == 'i' || letter == '-') {
            continue;
        }
        const std::string said = expectFiles({std::string("-") + letter}, NOTHING);
        EXPECT_EQ(std::count(said.begin(), said.end(), '\n'), 1) << letter << ": " << said;
    }
}

// Rules: OPT-09
TEST_F(OptionsTest, UnknownLetterDoesNotStopLaterOnes) {
    EXPECT_NE(expectFiles({"-x", "-a"}, AIRPLAY_FILE), "");
    EXPECT_NE(expectFiles({"-xa"}, AIRPLAY_FILE), "");
    EXPECT_NE(expectFiles({"-xi"}, IAP_FILES), "");
    EXPECT_NE(expectFiles({"-ax", "-i"}, ALL_FILES), "");
}

// Rules: OPT-08
TEST_F(OptionsTest, EveryUnknownLetterIsNamed) {
    const std::string said = expectFiles({"-xyx", "-z"}, NOTHING);
    EXPECT_EQ(std::count(said.begin(), said.end(), '\n'), 4) << said;
}

TEST_F(OptionsTest, LettersTakeNoArgument) {
    EXPECT_EQ(expectFiles({"-a", "i"}, AIRPLAY_FILE), "");
    EXPECT_EQ(expectFiles({"-i", "a"}, IAP_FILES), "");
}

// Rules: OPT-07, OPT-12, OPT-13
TEST_F(OptionsTest, FirstOperandEndsTheOptions) {
    for (const char* operand : {"word", "a", "i", "-", ""}) {
        EXPECT_EQ(expectFiles({operand, "-a"}, NOTHING), "");
        EXPECT_EQ(expectFiles({"-a", operand, "-i"}, AIRPLAY_FILE), "");
        EXPECT_EQ(expectFiles({"-i", operand, "-x"}, IAP_FILES), "");
    }
}

// Rules: OPT-14
TEST_F(OptionsTest, DoubleDashEndsTheOptions) {
    EXPECT_EQ(expectFiles({"--"}, NOTHING), "");
    EXPECT_EQ(expectFiles({"--", "-a"}, NOTHING), "");
    EXPECT_EQ(expectFiles({"-i", "--", "-a"}, IAP_FILES), "");
}

TEST_F(OptionsTest, ProgramNameIsNotAnOption) {
    putFolder("/tmp");
    char name[] = "-a";
    char* const arguments[] = {name, nullptr};
    optind = 0;
    EXPECT_EQ(runOptions(1, arguments), 0);
    EXPECT_EQ(folderNames("/tmp"), NOTHING);
}

TEST_F(OptionsTest, NoArgumentVectorDoesNothing) {
    char* const arguments[] = {nullptr};
    optind = 0;
    EXPECT_EQ(runOptions(0, arguments), 0);
    EXPECT_EQ(folderNames("/tmp"), NOTHING);
}

// Rules: RUN-01 to RUN-03
TEST_F(OptionsTest, FailureOfTheWritersIsNotAFailureOfTheProgram) {
    for (const char* path : {"/fs", "/dev", "/tmp"}) {
        remove(path);
    }
    EXPECT_EQ(run({"-ai"}), "");
    EXPECT_TRUE(std::filesystem::is_empty("/"));
}

TEST_F(OptionsTest, WriterThatThrowsEndsSilently) {
    StandardStreams streams;
    EXPECT_NO_THROW(runWriter([]() -> int { throw std::bad_alloc(); }));
    EXPECT_EQ(streams.stop(), "");
}

// Rules: RUN-01 to RUN-03
TEST_F(OptionsTest, StockFilesAreInstalledSilently) {
    remove(AIRPLAY_TEMPLATE);
    remove(DEVICE_TEMPLATE);
    remove(IAP2_TEMPLATE);
    EXPECT_EQ(expectFiles({"-ai"}, ALL_FILES), "");
    EXPECT_EQ(readFile(AIRPLAY_OUTPUT), "stock = 1\n");
    EXPECT_EQ(readFile(DEVICE_OUTPUT), "device stock\n");
}

TEST_F(OptionsTest, LeaveNoDescriptorOpen) {
    const int before = openDescriptors();
    run({"-ai", "-x"});
    EXPECT_EQ(openDescriptors(), before);
}

} // namespace orvane::test
