// SPDX-License-Identifier: Apache-2.0
//
// Memory runs out at every moment of a run: defaults are used, and nothing is printed.
#include "main/options.h"
#include "tests/support/accepted_outputs.h"
#include "tests/support/failing_memory.h"
#include "tests/support/standard_streams.h"
#include "tests/support/unit_test.h"

#include <unistd.h>

#include <fstream>

namespace orvane::test {

namespace {

class MemoryTest : public UnitTest {
protected:
    MemoryTest() { fillWholeUnit(); }

    static int runEverything() {
        char name[] = "orvane";
        char both[] = "-ai";
        char* arguments[] = {name, both, nullptr};
        optind = 0; // makes glibc's getopt start again
        return runOptions(2, arguments);
    }

    /// Whether a stream allocates memory before it is opened, as libc++'s does. If memory runs out,
    /// a file may then be missing.
    static bool streamsNeedMemory() {
        const FailingMemory memory(1, Shortage::once);
        try {
            const std::ofstream stream;
        } catch (const std::bad_alloc&) {
            return true;
        }
        return false;
    }

    static void expectAcceptedOutputs(bool mayBeAbsent) {
        for (const char* name : OUTPUT_NAMES) {
            const std::string path = std::string("/tmp/") + name;
            const bool isTuningFile = path.find("FFFF") != std::string::npos;
            if (!exists(path)) {
                EXPECT_TRUE(mayBeAbsent || isTuningFile) << name << " is missing";
                continue;
            }
            EXPECT_EQ(acceptedTexts(name).count(readFile(path)), 1U) << name << ":\n"
                                                                     << readFile(path);
            remove(path);
        }
    }

    static void failAtEveryMoment(Shortage shortage) {
        const bool mayBeAbsent = streamsNeedMemory();
        int moments = 0;
        for (bool hasFailed = true; hasFailed; ++moments) {
            SCOPED_TRACE("allocation " + std::to_string(moments + 1));
            int status = -1;
            {
                const FailingMemory memory(moments + 1, shortage);
                ASSERT_NO_THROW(status = runEverything());
                hasFailed = FailingMemory::hasFailed();
            }
            EXPECT_EQ(status, 0);
            expectAcceptedOutputs(mayBeAbsent && hasFailed);
            ASSERT_FALSE(HasFailure());
        }
        EXPECT_GT(moments, 10) << "the run hardly allocates memory: this tests nothing";
    }
};

// Rules: RUN-01
TEST_F(MemoryTest, EveryAllocationMayFailAlone) {
    failAtEveryMoment(Shortage::once);
}

// Rules: RUN-01
TEST_F(MemoryTest, MemoryMayRunOutForGoodAtEveryMoment) {
    failAtEveryMoment(Shortage::forGood);
}

TEST_F(MemoryTest, NoDefaultIsUsedWithEnoughMemory) {
    EXPECT_EQ(runEverything(), 0);
    EXPECT_NE(readFile("/tmp/airplay.conf").find(LONG_MODEL), std::string::npos);
    EXPECT_NE(readFile("/tmp/iap2.cfg").find(LONG_VERSION), std::string::npos);
    EXPECT_NE(readFile("/tmp/iap1.cfg").find("=030a02\n"), std::string::npos);
}

} // namespace

} // namespace orvane::test
