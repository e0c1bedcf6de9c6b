// SPDX-License-Identifier: Apache-2.0
#include "platform/option_parser.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <array>
#include <cstdlib>
#include <string>
#include <vector>

namespace orvane::test {

namespace {

/// Captures the standard error stream while it lives.
class CapturedStandardError {
public:
    CapturedStandardError() : former_(dup(STDERR_FILENO)) {
        if (former_ == -1 || pipe2(ends_.data(), O_CLOEXEC | O_NONBLOCK) != 0 ||
            dup2(ends_[1], STDERR_FILENO) == -1) {
            std::abort();
        }
    }
    ~CapturedStandardError() {
        dup2(former_, STDERR_FILENO);
        close(former_);
        close(ends_[0]);
        close(ends_[1]);
    }
    CapturedStandardError(const CapturedStandardError&) = delete;
    CapturedStandardError& operator=(const CapturedStandardError&) = delete;

    /// What was written since the last call.
    std::string text() const {
        std::string said(4096, '\0');
        const ssize_t length = read(ends_[0], said.data(), said.size());
        said.resize(length > 0 ? static_cast<std::size_t>(length) : 0);
        return said;
    }

private:
    int former_;
    std::array<int, 2> ends_{};
};

/// A command line as `main` gets it.
class CommandLine {
public:
    explicit CommandLine(std::vector<std::string> words) : words_(std::move(words)) {
        for (std::string& word : words_) {
            argv_.push_back(word.data());
        }
        argv_.push_back(nullptr);
    }
    int argc() const { return static_cast<int>(words_.size()); }
    char* const* argv() const { return argv_.data(); }

    /// The words in the order in which the parser left them.
    std::vector<std::string> words() const { return {argv_.begin(), argv_.end() - 1}; }

private:
    std::vector<std::string> words_;
    std::vector<char*> argv_;
};

struct Parsed {
    std::string letters; ///< all results before the -1
    std::string said;    ///< on standard error
    int next = 0;        ///< index of the first word that was not parsed
};

} // namespace

class OptionParserTest : public ::testing::Test {
protected:
    OptionParserTest() {
        unsetenv("POSIXLY_CORRECT");
        reset();
    }
    ~OptionParserTest() override { reset(); }

    /// Starts again: 0 makes this C library forget its position, even inside a word.
    static void reset() {
        optind = 0;
        opterr = 1;
    }

    static Parsed parse(const CommandLine& line, const char* letters = "ia") {
        reset();
        Parsed parsed;
        const CapturedStandardError held;
        while (parsed.letters.size() < 100) { // a parser that never ends fails and does not hang
            const int letter = platform::nextOption(line.argc(), line.argv(), letters);
            if (letter == -1) {
                break;
            }
            parsed.letters += static_cast<char>(letter);
        }
        parsed.said = held.text();
        parsed.next = optind;
        return parsed;
    }
};

TEST_F(OptionParserTest, NoArgumentsIsTheEnd) {
    const Parsed parsed = parse(CommandLine({"orvane"}));
    EXPECT_EQ("", parsed.letters);
    EXPECT_EQ("", parsed.said);
    EXPECT_EQ(1, parsed.next);
}

TEST_F(OptionParserTest, LettersComeInTheirOrder) {
    struct Case {
        std::vector<std::string> words;
        std::string letters;
    };
    const std::vector<Case> cases = {
        {{"orvane", "-a"}, "a"},        {{"orvane", "-i"}, "i"},
        {{"orvane", "-a", "-i"}, "ai"}, {{"orvane", "-i", "-a"}, "ia"},
        {{"orvane", "-ai"}, "ai"},      {{"orvane", "-ia"}, "ia"},
        {{"orvane", "-aa"}, "aa"},      {{"orvane", "-a", "-a", "-ia"}, "aaia"},
    };
    for (const Case& wanted : cases) {
        SCOPED_TRACE(wanted.letters);
        const Parsed parsed = parse(CommandLine(wanted.words));
        EXPECT_EQ(wanted.letters, parsed.letters);
        EXPECT_EQ("", parsed.said);
        EXPECT_EQ(static_cast<int>(wanted.words.size()), parsed.next);
    }
}

// Rules: OPT-12
TEST_F(OptionParserTest, FirstOperandIsTheEnd) {
    const Parsed parsed = parse(CommandLine({"orvane", "word", "-a"}));
    EXPECT_EQ("", parsed.letters);
    EXPECT_EQ("", parsed.said);
    EXPECT_EQ(1, parsed.next);
}

// Rules: OPT-12
TEST_F(OptionParserTest, OperandBetweenOptionsIsTheEnd) {
    const Parsed parsed = parse(CommandLine({"orvane", "-a", "word", "-i"}));
    EXPECT_EQ("a", parsed.letters);
    EXPECT_EQ(2, parsed.next);
}

TEST_F(OptionParserTest, WordsAreNotReordered) {
    const std::vector<std::string> words = {"orvane", "-a", "word", "-i", "--", "-a"};
    const CommandLine line(words);
    parse(line);
    EXPECT_EQ(words, line.words());
}

// Rules: OPT-14
TEST_F(OptionParserTest, DoubleDashIsTheEndAndIsPassed) {
    const Parsed parsed = parse(CommandLine({"orvane", "-a", "--", "-i"}));
    EXPECT_EQ("a", parsed.letters);
    EXPECT_EQ("", parsed.said);
    EXPECT_EQ(3, parsed.next);
}

// Rules: OPT-13
TEST_F(OptionParserTest, LoneDashIsAnOperand) {
    const Parsed parsed = parse(CommandLine({"orvane", "-a", "-", "-i"}));
    EXPECT_EQ("a", parsed.letters);
    EXPECT_EQ("", parsed.said);
    EXPECT_EQ(2, parsed.next);
}

TEST_F(OptionParserTest, EmptyWordIsAnOperand) {
    const Parsed parsed = parse(CommandLine({"orvane", "", "-a"}));
    EXPECT_EQ("", parsed.letters);
    EXPECT_EQ(1, parsed.next);
}

TEST_F(OptionParserTest, EndIsFinal) {
    const CommandLine line({"orvane", "-a", "word", "-i"});
    EXPECT_EQ('a', platform::nextOption(line.argc(), line.argv(), "ia"));
    for (int call = 0; call < 3; ++call) {
        EXPECT_EQ(-1, platform::nextOption(line.argc(), line.argv(), "ia"));
    }
}

// Rules: OPT-09
TEST_F(OptionParserTest, UnknownLetterIsAQuestionMarkAndParsingGoesOn) {
    EXPECT_EQ("?a", parse(CommandLine({"orvane", "-x", "-a"})).letters);
    EXPECT_EQ("a?i", parse(CommandLine({"orvane", "-axi"})).letters);
    EXPECT_EQ("??", parse(CommandLine({"orvane", "-A", "-I"})).letters);
}

// Rules: OPT-11
TEST_F(OptionParserTest, LongOptionsAreUnknownLetters) {
    EXPECT_EQ("?a", parse(CommandLine({"orvane", "--a"})).letters);
    EXPECT_EQ("?????", parse(CommandLine({"orvane", "--help"})).letters);
}

// Rules: OPT-08
TEST_F(OptionParserTest, DiagnosticIsTheCLibrarysOwn) {
    for (const char* word : {"-x", "-xy", "-A", "-?", "-+", "-:", "-;", "--a"}) {
        SCOPED_TRACE(word);
        const CommandLine line({"/bin/orvane", word, "-a"});
        std::string expected;
        {
            reset();
            const CapturedStandardError held;
            while (getopt(line.argc(), line.argv(), "ia") != -1) {
            }
            expected = held.text();
        }
        EXPECT_NE(std::string::npos, expected.find("/bin/orvane: ")) << expected;
        EXPECT_EQ(expected, parse(line).said);
    }
}

TEST_F(OptionParserTest, DiagnosticComesWithTheLetterItIsAbout) {
    const CommandLine line({"orvane", "-x", "-a", "-y"});
    const CapturedStandardError held;
    EXPECT_EQ('?', platform::nextOption(line.argc(), line.argv(), "ia"));
    EXPECT_NE("", held.text());
    EXPECT_EQ('a', platform::nextOption(line.argc(), line.argv(), "ia"));
    EXPECT_EQ("", held.text());
    EXPECT_EQ('?', platform::nextOption(line.argc(), line.argv(), "ia"));
    EXPECT_NE("", held.text());
}

TEST_F(OptionParserTest, SignsThatSteerTheCLibraryAreUnknownLetters) {
    for (const char* word : {"-+", "-:", "-;", "-?"}) {
        SCOPED_TRACE(word);
        const Parsed parsed = parse(CommandLine({"orvane", word, "-a"}));
        EXPECT_EQ("?a", parsed.letters);
        EXPECT_NE("", parsed.said);
    }
}

TEST_F(OptionParserTest, LettersAreChosenByTheCaller) {
    EXPECT_EQ("x??x", parse(CommandLine({"orvane", "-xaix"}), "x").letters);
    EXPECT_EQ("?", parse(CommandLine({"orvane", "-a"}), "").letters);
    EXPECT_EQ("abcdefghijklmn?",
              parse(CommandLine({"orvane", "-abcdefghijklmno"}), "abcdefghijklmn").letters);
}

TEST_F(OptionParserTest, ClusterIsFollowedAcrossCalls) {
    const CommandLine line({"orvane", "-aia", "-i"});
    for (const int wanted : std::array<int, 5>{'a', 'i', 'a', 'i', -1}) {
        EXPECT_EQ(wanted, platform::nextOption(line.argc(), line.argv(), "ia"));
    }
}

// Rules: RUN-06
TEST_F(OptionParserTest, WorksWithPosixlyCorrectSetToo) {
    ASSERT_EQ(0, setenv("POSIXLY_CORRECT", "1", 1));
    EXPECT_EQ("a", parse(CommandLine({"orvane", "-a", "word", "-i"})).letters);
    unsetenv("POSIXLY_CORRECT");
}

} // namespace orvane::test
