// SPDX-License-Identifier: Apache-2.0
//
// The usage record as the platform's `use` utility finds it: a section of the executable.
#include "kit/enter/captured_run.h"
#include "tests/support/host_command.h"
#include "tests/support/temporary_folder.h"
#include "tests/support/unit_test.h"

#include <elf.h>
#include <gtest/gtest.h>

#include <cstring>
#include <optional>
#include <string>

namespace orvane::test {

namespace {

const std::string USAGE = "Usage: orvane <options>\r\n"
                          "\r\n"
                          "Options:\r\n"
                          "  -i -- Update iAP config files\r\n"
                          "  -a -- Update airplay config file\r\n"
                          "\r\n";

struct Section {
    std::uint64_t flags;
    std::string bytes;
};

template <typename Header>
Header headerAt(const std::string& file, std::uint64_t offset) {
    Header header{};
    EXPECT_LE(offset + sizeof header, file.size());
    std::memcpy(&header, file.data() + offset, sizeof header);
    return header;
}

template <typename Ehdr, typename Shdr>
std::optional<Section> findSectionAs(const std::string& file, const std::string& name) {
    const auto head = headerAt<Ehdr>(file, 0);
    const auto names = headerAt<Shdr>(file, head.e_shoff + head.e_shstrndx * sizeof(Shdr));
    std::optional<Section> found;
    for (std::size_t index = 0; index < head.e_shnum; ++index) {
        const auto section = headerAt<Shdr>(file, head.e_shoff + index * sizeof(Shdr));
        if (name == file.data() + names.sh_offset + section.sh_name) {
            EXPECT_FALSE(found.has_value()) << "two sections of that name";
            found =
                Section{section.sh_flags, file.substr(static_cast<std::size_t>(section.sh_offset),
                                                      static_cast<std::size_t>(section.sh_size))};
        }
    }
    return found;
}

std::optional<Section> findSection(const std::string& file, const std::string& name) {
    return file.at(EI_CLASS) == ELFCLASS32 ? findSectionAs<Elf32_Ehdr, Elf32_Shdr>(file, name)
                                           : findSectionAs<Elf64_Ehdr, Elf64_Shdr>(file, name);
}

// Rules: OPT-15
TEST(UsageRecord, HoldsExactlyTheUsageText) {
    const auto section = findSection(readFile(ORVANE_BINARY), "QNX_usage");
    ASSERT_TRUE(section.has_value());
    EXPECT_EQ(section->bytes, USAGE);
}

TEST(UsageRecord, IsNotLoadedIntoMemory) {
    const auto section = findSection(readFile(ORVANE_BINARY), "QNX_usage");
    ASSERT_TRUE(section.has_value());
    EXPECT_EQ(section->flags, 0U); // no SHF_ALLOC, nor any other
}

TEST(UsageRecord, SurvivesStrip) {
    const TemporaryFolder folder;
    const std::string stripped = (folder.path() / "orvane").string();
    const kit::RunResult result = runOnHost({ORVANE_STRIP, "-o", stripped, ORVANE_BINARY});
    ASSERT_EQ(result.exitStatus, 0) << result.standardError;
    const std::string file = readFile(stripped);
    EXPECT_LT(file.size(), readFile(ORVANE_BINARY).size());
    const auto section = findSection(file, "QNX_usage");
    ASSERT_TRUE(section.has_value());
    EXPECT_EQ(section->bytes, USAGE);
    EXPECT_EQ(section->flags, 0U);
}

} // namespace

} // namespace orvane::test
