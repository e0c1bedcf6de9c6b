// SPDX-License-Identifier: Apache-2.0
//
// Compares blocks of arbitrary bytes with a second decoder, which has no table: one statement for
// each line of the file.
#include "tests/product/tuning/tuning_test.h"

#include <random>

namespace orvane::test {

namespace {

class NaiveDecoder {
public:
    explicit NaiveDecoder(const std::string& block) : block_(block) {}

    std::string text(int blockId) {
        out_ = "; Genereated config from DPS (blockId " + std::to_string(blockId) + ")\n";
        lowerHalf();
        upperHalf();
        return out_;
    }

private:
    void lowerHalf() {
        word("qwaAECSwitch", byte(0) % 4);
        word("qwaAGCSwitch", byte(0) / 4 % 4);
        word("qwaDiagSwitch", byte(0) / 16 % 4);
        word("qwaHFESwitch", byte(0) / 64);
        word("qwaMixFiltSwitch", byte(1) % 4);
        word("qwaMixSwitch", byte(1) / 4 % 4);
        word("qwaNRSwitch", byte(1) / 16 % 4);
        word("qwaRECSwitch", byte(2) % 4);
        word("qwaRecvAGCSwitch", byte(2) / 4 % 4);
        word("qwaRecvBWESwitch", byte(2) / 16 % 4);
        word("qwaRecvDLCSwitch", byte(2) / 64);
        word("qwaRecvDTFSwitch", byte(3) % 4);
        word("qwaRecvENSSwitch", byte(3) / 4 % 4);
        word("qwaRecvEQSwitch", byte(3) / 16 % 4);
        word("qwaSendDynEQSwitch", byte(4) % 4);
        word("qwaSendEQSwitch", byte(4) / 4 % 4);
        mode("qwaWNDBMode", byte(4) / 64);
        word("qwaWNDBSwitch", byte(5));
        line("qwaAECFiltLen", std::to_string(wide(6)));
        word("qwaLFRSwitch", wide(8));
        line("qwaHFEExtent", std::to_string(byte(10)));
        line("qwaNCParams", wides(13, 23));
        line("qwaNRAtten", std::to_string(wide(23)));
        line("qwaRECSuppress", std::to_string(byte(25)));
        line("qwaRecvAGCAmpTgts", wides(26, 30));
        line("qwaRecvAGCGainVals", wides(30, 36));
        line("qwaRecvAGCMaxRates", wides(36, 40));
        line("qwaRecvGain", std::to_string(wide(40)));
        line("qwaRecvLimitThresh", std::to_string(wide(42)));
        line("qwaRecvParamEQNodes", wides(44, 74));
    }

    void upperHalf() {
        line("qwaRefDelay", std::to_string(wide(76)));
        line("qwaRefMaxDelay", std::to_string(wide(78)));
        line("qwaSendAGCMaxRates", wides(84, 88));
        line("qwaSendAGCAmpTgts", wides(88, 92));
        line("qwaSendAGCGainVals", wides(92, 98));
        line("qwaSendDynEQMinMaxSNR", wides(98, 102));
        line("qwaSendGain", std::to_string(wide(102)));
        line("qwaSendLimitThresh", std::to_string(wide(104)));
        line("qwaSendParamEQ2Nodes", wides(106, 136));
        line("qwaSendParamEQNodes", wides(136, 166));
        line("qwaWNDBSuppress", std::to_string(byte(166)));
        line("qwaDNSEnable", std::to_string(wide(167)));
        word("qwaIVOSwitch", wide(169));
        line("qwaMEQEnable", wides(171, 179));
    }

    int byte(std::size_t offset) const { return static_cast<unsigned char>(block_.at(offset)); }
    int wide(std::size_t offset) const {
        const int value = byte(offset) + 256 * byte(offset + 1);
        return value < 32768 ? value : value - 65536;
    }
    std::string wides(std::size_t first, std::size_t end) const {
        std::string list;
        for (std::size_t offset = first; offset < end; offset += 2) {
            list += std::to_string(wide(offset)) + " ";
        }
        return list;
    }

    void line(const char* key, const std::string& value) { out_ += key + (" " + value) + "\n"; }
    void word(const char* key, int code) {
        line(key, code == 1 ? "qwaOff" : code == 2 ? "qwaOn" : code == 3 ? "qwaIdle" : "");
    }
    void mode(const char* key, int code) {
        line(key, code == 1   ? "qwaSingleChannel"
                  : code == 2 ? "qwaMultiChannel"
                  : code == 3 ? "qwaCombined"
                              : "");
    }

    std::string block_;
    std::string out_;
};

/// The same numbers in every run.
std::mt19937 numbersFrom(std::mt19937::result_type seed) {
    return std::mt19937(seed);
}

/// Arbitrary bytes; in every second block the wide switches have codes near those with words.
std::string randomBlock(std::mt19937& engine, bool hasWords) {
    std::string block(BLOCK_SIZE, '\0');
    for (char& byte : block) {
        byte = static_cast<char>(engine() & 0xFF);
    }
    if (hasWords) {
        block[5] = static_cast<char>(engine() % 5);
        block[8] = static_cast<char>(engine() % 5);
        block[9] = static_cast<char>(engine() % 8 == 0 ? 1 : 0);
        block[169] = static_cast<char>(engine() % 5);
        block[170] = static_cast<char>(engine() % 8 == 0 ? 1 : 0);
    }
    return block;
}

} // namespace

class TuningFileRandomTest : public TuningTest {};

// Rules: TUN-04, TUN-09, FLD-01 to FLD-44
TEST_F(TuningFileRandomTest, ArbitraryBlocksAgreeWithASecondDecoder) {
    std::mt19937 engine = numbersFrom(20090213);
    for (int round = 0; round < 200; ++round) {
        const int blockId = round % 10;
        const std::string block = randomBlock(engine, round % 2 == 1);
        setBlock(static_cast<unsigned>(blockId), 0, block);
        const std::string text = rendered(blockId);
        ASSERT_EQ(text, NaiveDecoder(block).text(blockId)) << "round " << round;
        ASSERT_EQ(splitLines(text).size(), 45U);
    }
}

TEST_F(TuningFileRandomTest, NeighbouringBlocksDoNotMix) {
    std::mt19937 engine = numbersFrom(7);
    std::vector<std::string> blocks;
    for (unsigned blockId = 0; blockId < 10; ++blockId) {
        blocks.push_back(randomBlock(engine, true));
        setBlock(blockId, 0, blocks.back());
    }
    for (int blockId = 0; blockId < 10; ++blockId) {
        const std::string& block = blocks.at(static_cast<std::size_t>(blockId));
        EXPECT_EQ(rendered(blockId), NaiveDecoder(block).text(blockId));
    }
}

} // namespace orvane::test
