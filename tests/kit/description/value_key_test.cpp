// SPDX-License-Identifier: Apache-2.0
#include "kit/description/value_key.h"

#include <gtest/gtest.h>

#include <map>
#include <string>

namespace orvane::test {

namespace {

using kit::ValueKey;

struct Spelling {
    ValueKey key;
    const char* text = nullptr;
};

const Spelling SPELLINGS[] = {
    {{}, ""},
    {kit::imageSizeKey(), "image.size"},
    {kit::paramKey(139), "param.139"},
    {kit::imageBytesKey(190), "image.bytes.190"},
    {kit::slotKey(9), "slot.9"},
    {kit::slotByteKey(9, 7), "slot.9.7"},
    {kit::auxKey(), "aux"},
    {kit::tuningBlockKey(3), "tuning.3"},
    {kit::tuningFieldKey(3, "qwaNRAtten"), "tuning.3.qwaNRAtten"},
    {kit::tuningRawKey(3), "tuning.3.raw"},
    {kit::diskBytesKey(0x7FFFFFFFFFFFFFFFU), "disk.bytes.9223372036854775807"},
    {kit::fileKey("/tmp/x"), "file./tmp/x"},
    {kit::fileKey("/tmp/a.b/x.5"), "file./tmp/a.b/x.5"},
    {kit::fileBytesKey("/tmp/x", 5), "file.bytes.5./tmp/x"},
    {kit::fileKey("/fs/folder/"), "file./fs/folder/"},
    {kit::linkKey("/tmp/\xff"), "link./tmp/\xff"},
    {kit::folderKey("/tmp"), "folder./tmp"},
    {kit::absentKey("/dev/x=y"), "absent./dev/x=y"},
};

TEST(ValueKeyTest, EveryKindIsPrintedAndParsedAgain) {
    std::map<ValueKey, std::string> texts;
    std::map<ValueKey::Kind, int> kinds;
    for (const auto& [key, text] : SPELLINGS) {
        EXPECT_EQ(kit::keyText(key), text);
        const kit::ParsedKey parsed = kit::parseKey(text);
        EXPECT_TRUE(parsed.key == key) << text;
        EXPECT_EQ(parsed.fault, "") << text;
        EXPECT_TRUE(texts.emplace(key, text).second) << text;
        ++kinds[key.kind];
    }
    EXPECT_EQ(kinds.size(), static_cast<std::size_t>(ValueKey::Kind::absent) + 1);
}

TEST(ValueKeyTest, KeysDifferByEachOfTheirParts) {
    EXPECT_TRUE(kit::slotByteKey(9, 7) != kit::slotByteKey(9, 6));
    EXPECT_TRUE(kit::slotByteKey(9, 7) != kit::slotByteKey(8, 7));
    EXPECT_TRUE(kit::fileKey("/tmp/x") != kit::fileKey("/tmp/y"));
    EXPECT_TRUE(kit::fileKey("/tmp/x") != kit::linkKey("/tmp/x"));
    EXPECT_TRUE(ValueKey() == ValueKey());
    EXPECT_TRUE(ValueKey().isEmpty());
    EXPECT_FALSE(kit::auxKey().isEmpty());
}

TEST(ValueKeyTest, NumbersMayBeHexadecimal) {
    EXPECT_TRUE(kit::parseKey("param.0x8B").key == kit::paramKey(139));
    EXPECT_TRUE(kit::parseKey("tuning.0x3.qwaNRAtten").key == kit::tuningFieldKey(3, "qwaNRAtten"));
}

TEST(ValueKeyTest, KeyThatAUnitLacksIsRefused) {
    struct Refusal {
        const char* text;
        ValueKey::Kind kind;
        const char* fault;
    };
    using Kind = ValueKey::Kind;
    const Refusal REFUSALS[] = {
        {"param.172", Kind::param, "a parameter number must be from 1 to 171, not \"172\""},
        {"param.", Kind::param, "a parameter number must be from 1 to 171, not \"\""},
        {"param.1.2", Kind::param, "a parameter number must be from 1 to 171, not \"1.2\""},
        {"slot.18", Kind::slot, "a slot number must be from 0 to 17, not \"18\""},
        {"slot.18.0", Kind::slotByte, "a slot number must be from 0 to 17, not \"18\""},
        {"slot.9.8", Kind::slotByte, "a byte of slot 9 must be from 0 to 7, not \"8\""},
        {"tuning.10", Kind::tuningBlock, "a tuning block must be from 0 to 9, not \"10\""},
        {"tuning.10.raw", Kind::tuningRaw, "a tuning block must be from 0 to 9, not \"10\""},
        {"tuning.3.qwaNone", Kind::tuningField, "there is no tuning field \"qwaNone\""},
        {"tuning.3.rawer", Kind::tuningField, "there is no tuning field \"rawer\""},
        {"tuning.3.", Kind::tuningField, "there is no tuning field \"\""},
        {"disk.bytes.9223372036854775808", Kind::diskBytes,
         "an offset must be from 0 to 9223372036854775807, not \"9223372036854775808\""},
        {"disk.bytes.99999999999999999999", Kind::diskBytes,
         "an offset must be from 0 to 9223372036854775807, not \"99999999999999999999\""},
        {"file.tmp", Kind::file, "a path must be absolute, unlike \"tmp\""},
        {"link.", Kind::link, "a path must be absolute, unlike \"\""},
        {"file.bytes.x./tmp", Kind::fileBytes,
         "an offset must be from 0 to 9223372036854775807, not \"x\""},
        {"auxiliary", Kind::none, "unknown key \"auxiliary\""},
        {"image.size.1", Kind::none, "unknown key \"image.size.1\""},
        {"params.22", Kind::none, "unknown key \"params.22\""},
        {"slot", Kind::none, "unknown key \"slot\""},
    };
    for (const Refusal& refusal : REFUSALS) {
        const kit::ParsedKey parsed = kit::parseKey(refusal.text);
        EXPECT_EQ(parsed.fault, refusal.fault);
        EXPECT_TRUE(parsed.key == ValueKey({refusal.kind, 0, 0, ""})) << refusal.text;
    }
}

} // namespace

} // namespace orvane::test
