// SPDX-License-Identifier: Apache-2.0
//
// Every character that can follow a "-".
#include "main/options.h"
#include "tests/product/writers/airplay_unit.h"
#include "tests/product/writers/iap_unit.h"
#include "tests/support/folder_names.h"
#include "tests/support/standard_streams.h"

#include <unistd.h>

#include <array>
#include <set>
#include <string>

namespace orvane::test {
namespace {

using Names = std::set<std::string>;

class EveryOptionTest : public IapUnitTest {
protected:
    EveryOptionTest() { writeFile(AIRPLAY_TEMPLATE, "static = 1\n"); }

    /// Runs `-c` and then `more`, in an empty output folder, and returns what is printed.
    static std::string run(char c, const std::string& more) {
        putFolder("/tmp");
        std::string program = "orvane";
        std::string option = {'-', c};
        std::string last = more;
        std::array<char*, 4> arguments = {program.data(), option.data(), last.data(), nullptr};
        optind = 0; // makes glibc's getopt start again
        StandardStreams streams;
        EXPECT_EQ(runOptions(3, arguments.data()), 0);
        return streams.stop();
    }

    /// The outputs of `-c` alone.
    static Names outputs(char c) {
        switch (c) {
        case 'a':
            return {"airplay.conf"};
        case 'i':
            return {"iap1.cfg", "iap2.cfg", "iap2_device.cfg"};
        default:
            return {};
        }
    }

    static bool isUnknown(char c) { return c != 'a' && c != 'i' && c != '-'; }

    template <class Check>
    static void forEveryCharacter(const Check& check) {
        for (int code = 1; code < 256 && !HasFailure(); ++code) {
            SCOPED_TRACE(code);
            check(static_cast<char>(code));
        }
    }

    /// The C library's line about an unknown option: it names the program, and the character last
    /// but for a quotation mark.
    static void expectMessage(const std::string& said, char c) {
        if (!isUnknown(c)) {
            EXPECT_EQ(said, "");
            return;
        }
        EXPECT_EQ(said.rfind("orvane: ", 0), 0U) << said;
        const std::string end = {'\'', c, '\'', '\n'};
        EXPECT_EQ(said.find(end) + end.size(), said.size()) << said;
    }
};

TEST_F(EveryOptionTest, RunsItsWriterOrNothing) {
    forEveryCharacter([](char c) {
        const std::string said = run(c, "word");
        EXPECT_EQ(folderNames("/tmp"), outputs(c));
        expectMessage(said, c);
    });
}

TEST_F(EveryOptionTest, IsFollowedByTheNextOption) {
    forEveryCharacter([](char c) {
        const std::string said = run(c, "-i");
        Names right = outputs(c);
        if (c != '-') { // which ends the options
            right.merge(outputs('i'));
        }
        EXPECT_EQ(folderNames("/tmp"), right);
        expectMessage(said, c);
    });
}

} // namespace
} // namespace orvane::test
