// SPDX-License-Identifier: Apache-2.0
//
// An output that fails half-way: what would follow is dropped, even if it could be written.
#include "tests/product/writers/airplay_unit.h"
#include "writers/airplay_writer.h"
#include "writers/iap_writer.h"

#include <gtest/gtest.h>

#include <sstream>
#include <stdexcept>
#include <streambuf>
#include <string>
#include <utility>

namespace orvane::test {

namespace {

/// A template whose first part can be read, and nothing after it: a library may report a read error
/// by such an exception.
class HalfATemplate : public std::streambuf {
public:
    explicit HalfATemplate(std::string firstPart) : firstPart_(std::move(firstPart)) {
        setg(firstPart_.data(), firstPart_.data(), firstPart_.data() + firstPart_.size());
    }

protected:
    int_type underflow() override { throw std::runtime_error("the second part can't be read"); }

private:
    std::string firstPart_;
};

/// Takes every byte; its first flush fails, and no other.
class FirstFlushFails : public std::stringbuf {
protected:
    int sync() override { return flushes_++ == 0 ? -1 : 0; }

private:
    int flushes_ = 0;
};

const std::string FIRST_PART = "the first part of the template\n";

/// The streams of one stage.
struct Stage {
    HalfATemplate half{FIRST_PART};
    std::istream templateFile{&half};
    std::ostringstream output;
};

/// What the stage has written ends with the first part, and its output has failed.
void expectEndedByTheFirstPart(const Stage& stage) {
    const std::string text = stage.output.str();
    ASSERT_GE(text.size(), FIRST_PART.size());
    EXPECT_EQ(text.substr(text.size() - FIRST_PART.size()), FIRST_PART);
    EXPECT_TRUE(stage.output.fail());
}

orvane::IapValues someValues() {
    orvane::IapValues values;
    values.model = "VOXA";
    return values;
}

} // namespace

// Rules: MRG-11
TEST(FailedOutputTest, DeviceFileHasNoClosingSection) {
    Stage device;
    EXPECT_EQ(generateIap2DeviceFile(device.templateFile, device.output, someValues()),
              MergeDecision::generate);
    expectEndedByTheFirstPart(device);
}

// Rules: MRG-11, ONE-09
TEST(FailedOutputTest, Iap2FileSendsIap1ToItsStockFile) {
    Stage iap2;
    EXPECT_EQ(generateIap2File(iap2.templateFile, iap2.output, someValues()),
              MergeDecision::generate);
    expectEndedByTheFirstPart(iap2);

    std::istringstream templateFile("iap1 template\n");
    std::ostringstream iap1;
    EXPECT_EQ(generateIap1File(templateFile, iap1, iap2.output, someValues()),
              MergeDecision::iap2Failed);
    EXPECT_EQ(iap1.str(), "");
}

// Rules: MRG-11
TEST(FailedOutputTest, Iap1AndAirplayFilesEndWithTheFirstPart) {
    const std::ostringstream iap2;
    Stage iap1;
    EXPECT_EQ(generateIap1File(iap1.templateFile, iap1.output, iap2, someValues()),
              MergeDecision::generate);
    expectEndedByTheFirstPart(iap1);

    Stage airplay;
    orvane::AirplayValues values;
    values.model = "VOXA";
    values.brand = "MARL";
    EXPECT_EQ(generateAirplayFile(airplay.templateFile, airplay.output, values),
              MergeDecision::generate);
    expectEndedByTheFirstPart(airplay);
}

TEST(FailedOutputTest, AirplayFileEndsWithTheLineWhoseFlushFails) {
    std::istringstream templateFile("template\n");
    FirstFlushFails buffer;
    std::ostream output(&buffer);
    orvane::AirplayValues values;
    values.model = "VOXA";
    values.brand = "MARL";
    values.audioProfile = 3;
    EXPECT_EQ(generateAirplayFile(templateFile, output, values), MergeDecision::generate);
    EXPECT_TRUE(output.fail());
    const std::string whole = plainAirplayHead();
    const std::string failing = "# audio profile for QWA\n";
    EXPECT_EQ(buffer.str(), whole.substr(0, whole.find(failing) + failing.size()));
}

} // namespace orvane::test
