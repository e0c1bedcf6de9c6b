// SPDX-License-Identifier: Apache-2.0
#include "kit/host/host_file.h"
#include "kit/tuning/tuning_encode.h"
#include "kit/unit/describe_unit.h"
#include "tests/kit/description/description_equality.h"
#include "tests/kit/description/random_unit.h"
#include "tests/support/temporary_folder.h"
#include "tests/support/unit_test.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <string>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;

constexpr std::size_t RECORD_AREA = 0x100000;

TEST(DescribeImage, ValuesAreParametersAndTheRestIsBytes) {
    std::string content(185, '\0');
    content[21] = 5;       // parameter 22
    content[133] = '\xCD'; // parameter 134, low byte first
    content[134] = '\xAB';
    content[143] = 1;      // the high byte of parameter 142
    content[178] = '\xFF'; // parameter 171, the last
    content[179] = 'x';    // after the catalogue
    content[184] = 'y';
    const kit::ImageDescription image = kit::describeImage(content);
    EXPECT_EQ(image.size, 185U);
    EXPECT_EQ(image.params, (std::map<std::uint16_t, std::uint16_t>{
                                {22, 5}, {134, 0xABCD}, {142, 0x0100}, {171, 0xFF}}));
    EXPECT_EQ(image.bytes,
              (std::map<std::uint32_t, kit::Bytes>{{179, std::string("x\0\0\0\0y", 6)}}));
}

TEST(DescribeImage, FirstByteOfACutOffParameterIsABytesEntry) {
    const kit::ImageDescription image = kit::describeImage(std::string(133, '\0') + "a");
    EXPECT_EQ(image.size, 134U);
    EXPECT_TRUE(image.params.empty());
    EXPECT_EQ(image.bytes, (std::map<std::uint32_t, kit::Bytes>{{133, "a"}}));
}

TEST(DescribeImage, ZerosAreOnlyTheirSize) {
    for (const std::size_t size : {0U, 1U, 179U, 5000U}) {
        kit::ImageDescription expected;
        expected.size = static_cast<std::uint32_t>(size);
        EXPECT_TRUE(kit::describeImage(std::string(size, '\0')) == expected) << size;
    }
}

/// A disk with the given bytes in its last mebibyte, by offset from the base.
std::string diskWith(const std::map<std::size_t, std::string>& parts, std::size_t before = 0) {
    std::string disk(before + RECORD_AREA, '\0');
    for (const auto& [offset, bytes] : parts) {
        disk.replace(before + offset, bytes.size(), bytes);
    }
    return disk;
}

TEST(DescribeDisk, RecordsAreNamedAndTheRestIsBytes) {
    const kit::DiskDescription disk =
        kit::describeDisk(diskWith({{0, "0"},                      // slot 0
                                    {1, std::string("1\0one", 5)}, // slot 1
                                    {129, "SN004217"},             // slot 9
                                    {137, "gap"},                  // after slot 9
                                    {2184, "GABCDE16"}, // the gap's last byte, slots 10 to 14, 16
                                    {2214, std::string("\0z", 2)}, // slot 17
                                    {2216, "behind"},              // after slot 17
                                    {3072, "aux"},                 // the auxiliary area
                                    {4096 + 3 * 188, "\x02"}, // block 3: its first switch is on
                                    {4096 + 1879, "\x07"},    // the last byte of block 9
                                    {4096 + 1880, "rest"},    // after the tenth block
                                    {RECORD_AREA - 1, "e"}},
                                   100));
    EXPECT_EQ(disk.size, RECORD_AREA + 100);
    EXPECT_EQ(disk.slots, (std::map<std::uint32_t, kit::Bytes>{{0, "0"},
                                                               {1, std::string("1\0one", 5)},
                                                               {9, "SN004217"},
                                                               {10, "A"},
                                                               {11, "B"},
                                                               {12, "C"},
                                                               {13, "D"},
                                                               {14, "E"},
                                                               {16, "16"},
                                                               {17, std::string("\0z", 2)}}));
    EXPECT_EQ(disk.aux, std::optional<kit::Bytes>("aux"));
    ASSERT_EQ(disk.tuning.size(), 2U);
    EXPECT_EQ(std::get<std::string>(disk.tuning.at(3).fields.at("qwaAECSwitch")), "qwaOn");
    EXPECT_EQ(disk.tuning.at(9).raw, std::string(187, '\0') + "\x07");
    EXPECT_EQ(disk.bytes, (std::map<std::uint64_t, kit::Bytes>{{237, "gap"},
                                                               {2284, "G"},
                                                               {2316, "behind"},
                                                               {4096 + 1980, "rest"},
                                                               {RECORD_AREA + 99, "e"}}));
}

TEST(DescribeDisk, BytesBeforeTheRecordAreaAreNotJoinedWithIt) {
    const std::string disk = diskWith({{0, "0"}}, 20);
    std::string content = disk;
    content[19] = 'x';
    const kit::DiskDescription description = kit::describeDisk(content);
    EXPECT_EQ(description.bytes, (std::map<std::uint64_t, kit::Bytes>{{19, "x"}}));
    EXPECT_EQ(description.slots, (std::map<std::uint32_t, kit::Bytes>{{0, "0"}}));
}

TEST(DescribeDisk, ShorterThanTheRecordAreaIsBytesOnly) {
    const std::string content = std::string(129, '\0') + std::string(RECORD_AREA - 130, 'x');
    const kit::DiskDescription disk = kit::describeDisk(content);
    EXPECT_EQ(disk.size, RECORD_AREA - 1);
    EXPECT_TRUE(disk.slots.empty() && !disk.aux && disk.tuning.empty());
    EXPECT_EQ(disk.bytes,
              (std::map<std::uint64_t, kit::Bytes>{{129, std::string(RECORD_AREA - 130, 'x')}}));
}

TEST(DescribeDisk, OfZerosIsOnlyItsSize) {
    for (const std::size_t size : {std::size_t{0}, std::size_t{5}, RECORD_AREA, 2 * RECORD_AREA}) {
        kit::DiskDescription expected;
        expected.size = size;
        EXPECT_TRUE(kit::describeDisk(std::string(size, '\0')) == expected) << size;
    }
}

TEST(DescribeDisk, FileAndMemoryAreDescribedAlike) {
    const TemporaryFolder folder;
    const fs::path file = folder.path() / "disk";
    for (std::uint32_t seed = 0; seed < 20; ++seed) {
        RandomUnit random(seed);
        const std::string content =
            random.bytes(random.below(4000)) + diskWith({{0, random.bytes(6300)}});
        writeFile(file, content);
        EXPECT_TRUE(kit::describeDisk(kit::openForReading(file), file, content.size()) ==
                    kit::describeDisk(content))
            << seed;
    }
}

TEST(DescribeTuningBlock, AllFieldsAreThereAndOnlyUnreadBitsAreRaw) {
    DpsBlock block{};
    block.bytes.fill(0xFF);
    const kit::TuningDescription description = kit::describeTuningBlock(block);
    EXPECT_EQ(description.fields.size(), 44U);
    EXPECT_EQ(std::get<std::string>(description.fields.at("qwaAECSwitch")), "qwaIdle");
    EXPECT_EQ(std::get<std::string>(description.fields.at("qwaWNDBMode")), "qwaCombined");
    EXPECT_EQ(std::get<std::int64_t>(description.fields.at("qwaWNDBSwitch")), 255);
    EXPECT_EQ(std::get<std::int64_t>(description.fields.at("qwaLFRSwitch")), -1);
    EXPECT_EQ(std::get<std::vector<std::int64_t>>(description.fields.at("qwaMEQEnable")),
              (std::vector<std::int64_t>{-1, -1, -1, -1}));
    std::string raw(188, '\0');
    raw[1] = '\xC0';
    raw[3] = '\xC0';
    raw[4] = '\x30';
    raw.replace(11, 2, 2, '\xFF');
    raw.replace(74, 2, 2, '\xFF');
    raw.replace(80, 4, 4, '\xFF');
    raw.replace(179, 9, 9, '\xFF');
    EXPECT_EQ(description.raw, raw);
}

TEST(DescribeTuningBlock, ZerosHaveNoRawBytes) {
    const kit::TuningDescription description = kit::describeTuningBlock({});
    EXPECT_EQ(description.raw, "");
    EXPECT_EQ(std::get<std::int64_t>(description.fields.at("qwaAECSwitch")), 0);
}

TEST(DescribeTuningBlock, EncodedAgainIsTheSameBlock) {
    for (std::uint32_t seed = 0; seed < 500; ++seed) {
        const DpsBlock block = RandomUnit(seed).block();
        ASSERT_EQ(kit::encodeTuningBlock(kit::describeTuningBlock(block)).bytes, block.bytes)
            << seed;
    }
}

} // namespace

} // namespace orvane::test
