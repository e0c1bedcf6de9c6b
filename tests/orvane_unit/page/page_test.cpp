// SPDX-License-Identifier: Apache-2.0
//
// What a page says about units with known values.
#include "kit/description/parse_description.h"
#include "kit/description/sample.h"
#include "kit/unit/make_unit.h"
#include "orvane_unit/explain/explain.h"
#include "orvane_unit/page/markup.h"
#include "orvane_unit/page/page.h"
#include "orvane_unit/page/room.h"
#include "orvane_unit/report/names.h"
#include "orvane_unit/show/decoded_unit.h"
#include "tests/kit/unit/described_unit.h"
#include "tests/orvane_unit/explain/reason_units.h"
#include "tests/support/temporary_folder.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <filesystem>
#include <functional>
#include <string>
#include <vector>

namespace orvane::test {

namespace {

using desk::PageUnit;

PageUnit unitAt(const std::filesystem::path& root) {
    return {"bench", desk::explainUnit(root, {"-ai"}), desk::decodeUnit(root), {}};
}

std::string pageOf(const std::function<void(kit::UnitDescription&)>& change) {
    const DescribedUnit described(change);
    return desk::pageText({unitAt(described.root())}, "ai");
}

void unchanged(kit::UnitDescription& /*unit*/) {}

PageUnit fleetUnit(const std::string& name, const std::string& model, const std::string& serial) {
    static const DescribedUnit DESCRIBED;
    PageUnit unit = unitAt(DESCRIBED.root());
    unit.name = name;
    unit.decoded.identity.model = model;
    unit.decoded.identity.serial = serial;
    return unit;
}

/// The part of `page` from `begin` to before the next `end`.
std::string partOf(const std::string& page, const std::string& begin, const std::string& end) {
    const std::size_t from = page.find(begin);
    EXPECT_NE(from, std::string::npos) << begin;
    return from == std::string::npos ? "" : page.substr(from, page.find(end, from) - from);
}

std::string sectionOf(const std::string& page, const std::string& name) {
    return partOf(page, "<section class=\"" + name + "\"", "</section>");
}

/// The row or item with a key in a part of a page.
std::string itemOf(const std::string& part, const std::string& element, const std::string& key) {
    const std::size_t at = part.find("data-key=\"" + key + "\"");
    EXPECT_NE(at, std::string::npos) << key;
    const std::size_t from = part.rfind("<" + element, at);
    const std::size_t to = part.find("</" + element + ">", at);
    return at == std::string::npos ? "" : part.substr(from, to - from);
}

std::size_t countOf(const std::string& text, const std::string& what) {
    std::size_t count = 0;
    for (std::size_t at = text.find(what); at != std::string::npos;
         at = text.find(what, at + what.size())) {
        ++count;
    }
    return count;
}

std::string repeated(const std::string& text, std::size_t count) {
    std::string all;
    for (std::size_t i = 0; i < count; ++i) {
        all += text;
    }
    return all;
}

bool holds(const std::string& text, const std::string& what) {
    return text.find(what) != std::string::npos;
}

std::string escaped(const std::string& text) {
    desk::Markup page;
    const std::size_t begin = page.document().size();
    page.addText(text);
    return page.document().substr(begin);
}

TEST(PageTest, SampleIsSmallAndItsPolicyAdmitsOnlyItsOwnStyleAndScript) {
    const TemporaryFolder temporary;
    const std::filesystem::path root = temporary.path() / "unit";
    kit::makeUnit(kit::parseDescription(kit::sampleDescriptionText(), "sample"), root);
    const std::string page = desk::pageText({unitAt(root)}, "ai");
    EXPECT_LT(page.size(), 300U * 1024);
    EXPECT_TRUE(holds(page, "content=\"default-src &#39;none&#39;; script-src &#39;sha256-"));
    EXPECT_TRUE(holds(page, "=&#39;; base-uri &#39;none&#39;; form-action &#39;none&#39;\">"));
    EXPECT_EQ(countOf(page, "<script"), 1U);
    EXPECT_EQ(countOf(page, "<style"), 1U);
    EXPECT_EQ(countOf(page, " style="), 0U);
    EXPECT_EQ(countOf(page, "http://") + countOf(page, "https://"), 0U);
    EXPECT_EQ(countOf(page, "<title>"), 1U + countOf(page, "<g class=\"part "));
}

TEST(PageTest, TwoHundredUnitsHaveRoomInTwentyMebibytes) {
    const TemporaryFolder temporary;
    const std::filesystem::path root = temporary.path() / "unit";
    kit::makeUnit(kit::parseDescription(kit::sampleDescriptionText(), "sample"), root);
    const PageUnit unit = unitAt(root);
    const std::size_t two = desk::pageText({unit, unit}, "ai").size();
    const std::size_t more = desk::pageText({unit, unit, unit}, "ai").size() - two;
    EXPECT_LT(two + 198 * more, 19U << 20U); // with a reserve
}

TEST(PageTest, EveryReasonIsInTheTileOrAtTheLineOfItsOutput) {
    for (const ReasonUnit& unit : reasonUnits()) {
        const desk::ReasonInfo& info = reasonInfo(unit.reason);
        SCOPED_TRACE(info.code);
        const std::string page = pageOf(unit.change);
        const std::string verdict = sectionOf(page, "verdict");
        const std::string tile =
            partOf(verdict, ">" + std::string(unit.output) + "</a>", "</ul></li>");
        const std::string output =
            partOf(page, "data-path=\"" + std::string(unit.output) + "\"", "</section>");
        const std::string sentence = escaped(info.sentence);
        EXPECT_TRUE(holds(tile, sentence) || holds(output, sentence));
        EXPECT_TRUE(holds(tile, std::string("class=\"state\">") + nameOf(unit.outcome) + "<"));
        EXPECT_TRUE(holds(output, std::string("class=\"state\">") + nameOf(unit.outcome) + "<"));
        if (!info.isIntended) {
            EXPECT_TRUE(holds(tile, sentence));
            EXPECT_TRUE(holds(tile, "not as intended"));
            EXPECT_TRUE(holds(tile, "look at"));
        }
    }
}

TEST(PageTest, AllAsIntendedIsSaidAndNothingElse) {
    const std::string verdict = sectionOf(pageOf(unchanged), "verdict");
    EXPECT_TRUE(holds(verdict, "All outputs are as intended."));
    EXPECT_FALSE(holds(verdict, "fallback"));
    EXPECT_FALSE(holds(verdict, "look at"));
}

TEST(PageTest, LineHasItsNumberItsTextAndItsOrigin) {
    const std::string page = pageOf(unchanged);
    const std::string output = partOf(page, "data-path=\"/tmp/iap2_device.cfg\"", "</section>");
    const std::string serial = itemOf(output, "tr", "slot.9");
    EXPECT_TRUE(holds(output, "<tbody data-reasons=\"from-record\">" + serial));
    EXPECT_TRUE(holds(serial, "<th>6</th>"));
    EXPECT_TRUE(holds(serial, "<code>serial=SN004217</code>"));
    EXPECT_TRUE(holds(serial, "a record slot of the boot disk: record slot 9, disk bytes from "
                              "1048705: 53 4e 30 30 34 32 31 37"));
    const std::string copied = itemOf(output, "tr", "file./fs/mp/etc/iap2_device_static.cfg");
    EXPECT_TRUE(holds(copied, "<code>device template</code>"));
}

TEST(PageTest, LineWithoutAnEndAndLineLeftOutAreMarked) {
    const std::string page = pageOf([](kit::UnitDescription& unit) {
        unit.files[AIRPLAY_FILE.templateFile] = "a\n\nb";
        unit.absent = {CONFIG_SHM_NAME};
    });
    const std::string output = partOf(page, "data-path=\"/tmp/airplay.conf\"", "</section>");
    EXPECT_EQ(countOf(output, "(no line end)"), 1U);
    EXPECT_TRUE(holds(output, "<code>b</code>\n<small class=\"sign\">(no line end)</small>"));
    EXPECT_EQ(countOf(output, "(left out)"), 1U);
    EXPECT_TRUE(holds(itemOf(output, "tr", "param.134"), "(left out)"));
}

TEST(PageTest, WhatIsLeftByAnEarlierRunIsShown) {
    const std::string page = pageOf([](kit::UnitDescription& unit) {
        unit.files[TELEPHONY_TUNING_FILE] = "of an earlier run\n";
    });
    const std::string output =
        partOf(page, "data-path=\"" + std::string(TELEPHONY_TUNING_FILE) + "\"", "</section>");
    EXPECT_TRUE(holds(output, "After the run, a file is there that this output did not write:"));
    EXPECT_TRUE(holds(output, "<code>of an earlier run</code>"));
    const std::string other =
        partOf(page, "data-path=\"" + std::string(SPEECHREC_TUNING_FILE) + "\"", "</section>");
    EXPECT_TRUE(holds(other, "After the run, nothing is there."));
}

TEST(PageTest, ImageHasACellForEachByte) {
    const std::string image = sectionOf(pageOf(unchanged), "image");
    EXPECT_EQ(countOf(image, "<li class=\"cell "), 179U);
    EXPECT_EQ(countOf(image, ">read</span>"), 6U); // five parameters, one of two bytes
    EXPECT_EQ(countOf(image, "past the end</span>"), 0U);
    const std::string model = itemOf(image, "li", "param.139");
    EXPECT_TRUE(holds(model, "class=\"cell group-3 read\""));
    EXPECT_TRUE(holds(model, "<b>139</b>\n<code>1a</code>"));
    EXPECT_TRUE(holds(
        model, "byte 139, group 3, raw 26, default 0, mask 0x7ffffffe: model Quarion Velmira"));
    EXPECT_TRUE(holds(image, "<small>byte 0, group 0, raw 0, default 0, mask 0xffffffff</small>"));
    EXPECT_TRUE(holds(image, "byte 134, the upper one of parameter 134"));
}

TEST(PageTest, CellsPastTheEndOfAShortImageAreMarked) {
    const std::string image = sectionOf(pageOf([](kit::UnitDescription& unit) {
                                            unit.image = {};
                                            unit.image.size = 134;
                                        }),
                                        "image");
    EXPECT_TRUE(holds(image, "134 bytes of 179."));
    EXPECT_EQ(countOf(image, "past the end</span>"), 179U - 134);
    EXPECT_EQ(countOf(image, "<code>--</code>"), 179U - 134);
    const std::string none = sectionOf(
        pageOf([](kit::UnitDescription& unit) { unit.absent = {CONFIG_SHM_NAME}; }), "image");
    EXPECT_TRUE(holds(none,
                      "There is no usable image: the configuration image can&#39;t be opened. "
                      "The tool&#39;s own defaults hold."));
    EXPECT_EQ(countOf(none, "past the end</span>"), 179U);
}

TEST(PageTest, RecordAreaIsDrawnAndListed) {
    const std::string records = sectionOf(
        pageOf([](kit::UnitDescription& unit) { unit.disk.slots[16] = "<line> 7"; }), "records");
    EXPECT_TRUE(holds(records, "<svg class=\"drawing\" role=\"img\""));
    EXPECT_TRUE(holds(records, "<title>slot 9: 8 bytes at 129</title>"));
    EXPECT_TRUE(holds(records, "<title>auxiliary area: 1024 bytes at 3072</title>"));
    EXPECT_TRUE(holds(records, "<title>tuning block 9: 188 bytes at 5788</title>"));
    EXPECT_TRUE(holds(records, "<title>unused: 2048 bytes at 137</title>"));
    EXPECT_TRUE(holds(records, "<title>unused: 1040384 bytes at 8192</title>"));
    const std::string table = partOf(records, "<table class=\"slots\"", "</table>");
    EXPECT_TRUE(holds(itemOf(table, "tr", "slot.9"), "<code>53 4e 30 30 34 32 31 37</code>"));
    EXPECT_TRUE(holds(itemOf(table, "tr", "slot.16"), "<code>&lt;line&gt; 7</code>"));
    EXPECT_TRUE(holds(itemOf(table, "tr", "slot.15"), "repeats slots 1 to 9"));
    EXPECT_TRUE(holds(itemOf(table, "tr", "slot.0"), "zeros"));
    EXPECT_TRUE(holds(itemOf(table, "tr", "aux"), "<td>3072</td>\n<td>1024</td>\n<td>zeros</td>"));
    EXPECT_TRUE(holds(records, "<strong class=\"state\">computed</strong>"));
}

/// What the drawing says of the part with a title.
std::string contentOfPart(const std::string& records, const std::string& title) {
    const std::string begin = "<title>" + title + "</title>\n<desc>";
    return partOf(records, begin, "</desc>").substr(begin.size());
}

TEST(PageTest, PartsOfTheRecordAreaHaveTheirContent) {
    constexpr std::uint64_t BASE = 1U << 20U;
    const std::string records = sectionOf(pageOf([](kit::UnitDescription& unit) {
                                              unit.disk.aux = std::string("\0ab", 3);
                                              unit.disk.tuning[7].raw =
                                                  std::string("x\0y", 3) + std::string(30, 'z');
                                              unit.disk.bytes[BASE + 200] = "note";
                                              unit.disk.bytes[BASE + 2216] = "n";
                                              unit.disk.bytes[BASE + 6000] = std::string(32, 'n');
                                              unit.disk.bytes[BASE + 8000] = "far";
                                          }),
                                          "records");
    EXPECT_EQ(countOf(records, "<desc>"), countOf(records, "<g class=\"part "));
    EXPECT_EQ(contentOfPart(records, "slot 9: 8 bytes at 129"),
              "8 bytes not zero, the first at 129: 53 4e 30 30 34 32 31 37");
    EXPECT_EQ(contentOfPart(records, "slot 8: 16 bytes at 113"), "zeros");
    EXPECT_EQ(contentOfPart(records, "auxiliary area: 1024 bytes at 3072"),
              "2 bytes not zero, the first at 3073: 61 62");
    EXPECT_EQ(contentOfPart(records, "tuning block 7: 188 bytes at 5412"),
              "32 bytes not zero, the first at 5412: 78 00 79" + repeated(" 7a", 29) + " ...");
    EXPECT_EQ(contentOfPart(records, "tuning block 6: 188 bytes at 5224"), "zeros");
    EXPECT_EQ(contentOfPart(records, "unused: 2048 bytes at 137"),
              "4 bytes not zero, the first at 200: 6e 6f 74 65");
    EXPECT_EQ(contentOfPart(records, "unused: 856 bytes at 2216"),
              "1 byte not zero, the first at 2216: 6e");
    EXPECT_EQ(
        contentOfPart(records, "rest of the tuning area, which nothing reads: 2216 bytes at 5976"),
        "35 bytes not zero, the first at 6000: 6e" + repeated(" 6e", 31) + " ...");
    EXPECT_EQ(contentOfPart(records, "unused: 1040384 bytes at 8192"), "zeros");
}

TEST(PageTest, DrawingHasColoursWithoutTheStyle) {
    const std::string drawing =
        partOf(sectionOf(pageOf(unchanged), "records"), "<svg class=\"drawing\"", "</svg>");
    EXPECT_EQ(countOf(drawing, "<rect "), countOf(drawing, " fill=\"#"));
    EXPECT_EQ(countOf(drawing, "<path "), countOf(drawing, " fill=\"none\""));
    EXPECT_EQ(countOf(drawing, "<text "), countOf(drawing, " stroke=\"none\">"));
}

TEST(PageTest, BytesThatBelongToNothingAreShown) {
    constexpr std::uint64_t BASE = 1U << 20U; // of the record area on a disk of two mebibytes
    const std::string records = sectionOf(pageOf([](kit::UnitDescription& unit) {
                                              unit.disk.bytes[200] = "before the area";
                                              unit.disk.bytes[BASE + 200] = "note";
                                              for (std::uint64_t i = 0; i < 20; ++i) {
                                                  unit.disk.bytes[BASE + 9000 + 100 * i] =
                                                      std::string(40, 'x');
                                              }
                                          }),
                                          "records");
    EXPECT_TRUE(holds(records, "Bytes that are not zero, at unused places:"));
    EXPECT_TRUE(holds(itemOf(records, "li", "disk.bytes.1048776"),
                      "4 bytes at 200: \n<code>6e 6f 74 65</code>"));
    EXPECT_TRUE(holds(itemOf(records, "li", "disk.bytes.1057576"), "78</code> ..."));
    EXPECT_TRUE(holds(records, "<li>5 more places</li>"));
    EXPECT_FALSE(holds(sectionOf(pageOf(unchanged), "records"), "unused places"));
}

TEST(PageTest, DiskThatCannotBeReadIsSaid) {
    const std::string page = pageOf([](kit::UnitDescription& unit) { unit.absent = {BOOT_DISK}; });
    const std::string records = sectionOf(page, "records");
    EXPECT_TRUE(holds(records, "the boot disk can&#39;t be opened"));
    EXPECT_EQ(countOf(records, "can&#39;t be read</td>"), 18U); // 17 slots, and the auxiliary area
    EXPECT_EQ(countOf(records, "<desc>can&#39;t be read</desc>"), countOf(records, "<desc>"));
    EXPECT_TRUE(holds(records, "<strong class=\"state\">unreadable</strong>"));
    EXPECT_TRUE(holds(sectionOf(page, "tuning"), "the boot disk can&#39;t be opened."));
}

TEST(PageTest, TuningBlocksAreSideBySide) {
    const std::string tuning =
        sectionOf(pageOf([](kit::UnitDescription& unit) {
                      kit::TuningDescription& third = unit.disk.tuning[3];
                      third.raw = std::string("\0\xC0", 2);
                      third.fields["qwaAECSwitch"] = std::string("qwaOn");
                      third.fields["qwaNRAtten"] = std::int64_t{-40};
                      third.fields["qwaRecvAGCAmpTgts"] = std::vector<std::int64_t>{-7, 0};
                      unit.disk.tuning[7].raw = "x";
                  }),
                  "tuning");
    EXPECT_EQ(countOf(partOf(tuning, "<tbody>", "</tbody>"), "<th>"), 44U);
    EXPECT_TRUE(holds(tuning, "<th>block 2, speech recognition</th>\n<th>block 3, telephony</th>"
                              "\n<th>comparison</th>"));
    EXPECT_EQ(countOf(tuning, "<tr class=\"differs\""), 3U);
    EXPECT_TRUE(holds(itemOf(tuning, "td", "tuning.3.qwaAECSwitch"),
                      "<span class=\"word code-2\">qwaOn</span> 2"));
    EXPECT_TRUE(holds(itemOf(tuning, "td", "tuning.2.qwaAECSwitch"), "no word"));
    EXPECT_TRUE(holds(itemOf(tuning, "tr", "tuning.3.qwaNRAtten"), "\u2260 differs"));
    EXPECT_TRUE(holds(itemOf(tuning, "td", "tuning.3.qwaNRAtten"), ">-40"));
    const std::string list = itemOf(tuning, "td", "tuning.3.qwaRecvAGCAmpTgts");
    EXPECT_TRUE(holds(list, ">-7, 0</span>"));
    EXPECT_TRUE(holds(list, "<path class=\"bar differs\" d=\"M0 0h5v24h-5z\"/>"));
    EXPECT_TRUE(holds(list, "<path class=\"bar\" d=\"M7 0h5v1h-5z\"/>"));
    EXPECT_TRUE(holds(itemOf(tuning, "li", "tuning.3.raw"), "byte 1: no field reads"));
    EXPECT_TRUE(holds(itemOf(tuning, "li", "tuning.3.raw"), "<code>0xc0</code>"));
    EXPECT_TRUE(holds(itemOf(tuning, "li", "tuning.7"), ": 1 byte not zero, the first at 0: 78"));
    EXPECT_TRUE(holds(itemOf(tuning, "li", "tuning.0"), ": zeros"));
}

TEST(PageTest, VersionBecomesDigitsStepByStep) {
    const std::string versions = sectionOf(pageOf([](kit::UnitDescription& unit) {
                                               unit.files["/fs/rwdata/.Version/other.inf"] =
                                                   "Type=Boot\nVersion Number=9.9.9\n";
                                           }),
                                           "versions");
    EXPECT_EQ(countOf(versions, "<li class=\"version"), 2U);
    EXPECT_EQ(countOf(versions, "<li class=\"version chosen\""), 1U);
    EXPECT_TRUE(holds(versions, "<code class=\"version-text\">3.10.2_rc</code>"));
    EXPECT_TRUE(holds(versions, "<code class=\"version-digits\">030a02</code>"));
    const std::string steps = partOf(versions, "<ol class=\"steps\"", "</ol>");
    EXPECT_TRUE(holds(steps, "<code>ABC_3.10.2_rc</code>"));
    EXPECT_TRUE(holds(steps, "component &quot;10&quot;, the number 10, in hexadecimal: "
                             "\n<code>0a</code>"));
    EXPECT_EQ(countOf(steps, "<li>"), 6U);
}

TEST(PageTest, WithoutAVersionTheDigitsAreThoseForNone) {
    const std::string none = sectionOf(
        pageOf([](kit::UnitDescription& unit) { unit.files.erase("/fs/rwdata/.Version/app.inf"); }),
        "versions");
    EXPECT_TRUE(holds(none, "There is no version description file."));
    EXPECT_TRUE(holds(none, "<p class=\"summary\">There is no version; its digits are "));
    EXPECT_FALSE(holds(none, "version-text"));
    EXPECT_TRUE(holds(none, "no file is chosen, so the digits are those for no version: "
                            "\n<code>000000</code>"));
    const std::string na = sectionOf(pageOf([](kit::UnitDescription& unit) {
                                         unit.files["/fs/rwdata/.Version/app.inf"] =
                                             "Type=Application\nVersion Number=N/A\n";
                                     }),
                                     "versions");
    EXPECT_TRUE(holds(na, "those for none: \n<code>000000</code>"));
}

/// The page of a unit whose first output has this one line, or these.
std::string outputPage(const std::string& text) {
    PageUnit unit = fleetUnit("a", "M", "1");
    unit.explanation.front().lines = {{text, desk::fixedText()}};
    unit.explanation.front().contentAfter = text;
    return partOf(desk::pageText({unit}, "ai"), "<section class=\"output ", "</section>");
}

TEST(PageTest, LinesThatAreTooManyAreCounted) {
    const std::string whole = outputPage(repeated("x\n", desk::Room::MOST_TEXTS));
    EXPECT_EQ(countOf(whole, "<code>x</code>"), desk::Room::MOST_TEXTS);
    EXPECT_FALSE(holds(whole, "more line"));
    const std::string begin = outputPage(repeated("x\n", desk::Room::MOST_TEXTS + 1));
    EXPECT_EQ(countOf(begin, "<code>x</code>"), desk::Room::MOST_TEXTS);
    EXPECT_TRUE(holds(begin, "<p class=\"more\">1 more line (2 bytes): see "
                             "\n<code>orvane-unit explain --json --content</code></p>"));
    EXPECT_TRUE(holds(outputPage(repeated("x\n", desk::Room::MOST_TEXTS + 1) + "abc"),
                      "2 more lines (5 bytes): "));
}

TEST(PageTest, LineThatIsTooLongIsCut) {
    const std::string longest(desk::Room::MOST_BYTES, 'x');
    EXPECT_FALSE(holds(outputPage(longest + "\n"), "more byte"));
    const std::string cut = outputPage(longest + "yz\nnext");
    EXPECT_TRUE(holds(cut, "xxx</code>\n<small class=\"sign\">(2 more bytes)</small></td>"));
    EXPECT_TRUE(holds(cut, "1 more line (4 bytes): "));
}

/// The part of a page about so many version files, of which `chosen` counts.
std::string versionsPage(std::size_t count, std::size_t chosen, const Inf_Data& record) {
    PageUnit unit = fleetUnit("a", "M", "1");
    desk::VersionFiles& versions = unit.decoded.versions.found;
    versions.files.clear();
    for (std::size_t i = 0; i < count; ++i) {
        versions.files.push_back({"/" + std::to_string(i) + ".inf", record, i == chosen});
    }
    versions.chosen = chosen;
    return sectionOf(desk::pageText({unit}, "ai"), "versions");
}

TEST(PageTest, VersionFilesThatAreTooManyAreCounted) {
    // The chosen one has room of its own.
    const std::string whole = versionsPage(desk::Room::MOST_TEXTS + 1, 0, {});
    EXPECT_EQ(countOf(whole, "<li class=\"version"), desk::Room::MOST_TEXTS + 1);
    EXPECT_FALSE(holds(whole, "more file"));
    const std::string begin =
        versionsPage(desk::Room::MOST_TEXTS + 9, desk::Room::MOST_TEXTS + 5, {});
    EXPECT_EQ(countOf(begin, "<li class=\"version"), desk::Room::MOST_TEXTS + 1);
    EXPECT_TRUE(holds(begin, "/" + std::to_string(desk::Room::MOST_TEXTS + 5) + ".inf</h4>"));
    EXPECT_TRUE(holds(begin, "<p class=\"more\">8 more files: see "
                             "\n<code>orvane-unit show --only versions</code></p>"));
}

TEST(PageTest, VersionsThatAreTooLongAreCut) {
    Inf_Data record;
    for (std::size_t i = 0; i < desk::Room::MOST_TEXTS; ++i) {
        record.emplace("key " + std::to_string(i), "v");
    }
    const std::string keys = versionsPage(1, 0, record);
    EXPECT_EQ(countOf(keys, "<tr><th>key "), desk::Room::MOST_TEXTS / 2);
    EXPECT_TRUE(holds(keys, ">" + std::to_string(desk::Room::MOST_TEXTS / 2) + " more keys: see "));
    const std::string longText(desk::Room::MOST_BYTES, 'x');
    const std::string text = versionsPage(1, 0, {{"Version Number", "1." + longText + ".3"}});
    EXPECT_LT(text.size(), desk::Room::MOST_BYTES + 16 * desk::LONGEST_IN_SENTENCE);
    EXPECT_TRUE(holds(text, "xxx ... (28676 more bytes)</code>"));
}

TEST(PageTest, PageOfTheLargestUnitIsBelowFourMebibytes) {
    std::string text;
    for (std::size_t i = 0; i < desk::Room::MOST_TEXTS; ++i) {
        text += std::string(desk::Room::MOST_BYTES / desk::Room::MOST_TEXTS, '&') + "\n";
    }
    PageUnit unit = fleetUnit("a", "M", "1");
    for (desk::Output& output : unit.explanation) {
        output.lines = {{text + text, {{desk::Reason::fromTemplate}, kit::fileKey("/t"), {}}}};
        output.contentAfter = text;
    }
    unit.decoded.versions.found.files.assign(20000, {"/&.inf", {{"key", text}}, false});
    unit.decoded.versions.found.chosen = 0;
    EXPECT_LT(desk::pageText({unit}, "ai").size(), 4U << 20U);
}

TEST(PageTest, FilesHaveTheirKeys) {
    const std::string files = sectionOf(pageOf(unchanged), "files");
    EXPECT_TRUE(holds(itemOf(files, "tr", "file./fs/mp/etc/airplay_static.conf"),
                      "<td>template</td>\n<td>17 bytes</td>"));
    EXPECT_TRUE(holds(itemOf(files, "tr", "file./tmp/iap1.cfg"), "<td>missing</td>"));
}

TEST(PageTest, BytesOfAHostileUnitStayText) {
    const std::string attack = "\"'></script><script>alert(1)</script><img src=x onerror=y>";
    const std::string page = pageOf([&attack](kit::UnitDescription& unit) {
        unit.disk.slots[9] = "</td><b>";
        unit.disk.slots[16] = "\"onclick=\"x";
        unit.disk.aux = attack + "\u202E\u202C\xFF";
        unit.files[AIRPLAY_FILE.templateFile] = attack + "\n\x1B[31m\n";
        unit.files["/fs/rwdata/.Version/\" onfocus=\"x'><i>.inf"] =
            "Type=Boot\n" + attack + "=" + attack + "\n";
    });
    EXPECT_EQ(countOf(page, "<script"), 1U);
    for (const char* const begin : {"<img", "<b>", "<i>", "\" on", "' on"}) {
        const std::size_t own = std::string(begin) == "<b>" ? 179 : 0;
        EXPECT_EQ(countOf(page, begin), own) << begin;
    }
    EXPECT_TRUE(holds(page, "\\xe2\\x80\\xae\\xe2\\x80\\xac\\xff"));
    EXPECT_TRUE(holds(page, "\\x1b[31m"));
    EXPECT_TRUE(std::all_of(page.begin(), page.end(), [](char byte) {
        return byte == '\n' || static_cast<unsigned char>(byte) >= ' ';
    }));
}

TEST(PageTest, FleetHasARowForEachUnitAndMarksRareValues) {
    std::vector<PageUnit> units = {fleetUnit("a", "M", "1"), fleetUnit("b", "M", "2"),
                                   fleetUnit("c<", "N", "3")};
    units[1].explanation[2].outcome = desk::Outcome::stock;
    units[1].explanation[2].reasons = {desk::Reason::templateMissing};
    const std::string page = desk::pageText(units, "ai");
    EXPECT_TRUE(holds(page, "<title>3 units - orvane-unit report</title>"));
    const std::string fleet = partOf(page, "<section id=\"fleet\"", "</section>");
    EXPECT_TRUE(holds(fleet, "3 units, 2 of them all as intended."));
    EXPECT_TRUE(holds(fleet, "<a href=\"#unit-3\">c&lt;</a>"));
    EXPECT_TRUE(holds(page, "<article class=\"unit\" id=\"unit-3\">"));
    EXPECT_EQ(countOf(fleet, " rare\""), 2U); // the model N, and the stock file; no serial
    EXPECT_TRUE(holds(fleet, "<td class=\"value rare\">N"));
    EXPECT_TRUE(holds(fleet, "<td class=\"tile state-stock fallback rare\">stock"));
    EXPECT_TRUE(holds(fleet, "<td>2 generated, 1 stock</td>"));
    EXPECT_TRUE(holds(fleet, "<td>3 not-asked</td>"));
}

TEST(PageTest, NothingIsRareAmongTheMostFrequent) {
    const std::string halves =
        desk::pageText({fleetUnit("a", "M", "1"), fleetUnit("b", "N", "2")}, "ai");
    EXPECT_FALSE(holds(halves, " rare\""));
    const std::string fleet = desk::pageText({fleetUnit("a", "M", "1"), fleetUnit("b", "N", "2"),
                                              fleetUnit("c", "M", "3"), fleetUnit("d", "N", "4"),
                                              fleetUnit("e", "O", "5")},
                                             "ai");
    EXPECT_EQ(countOf(fleet, " rare\""), 1U);
    EXPECT_TRUE(holds(fleet, "<td class=\"value rare\">O"));
}

TEST(PageTest, FleetTellsDefaultsFromWhatWasRead) {
    PageUnit unread = fleetUnit("b", "M", "00000000");
    unread.decoded.records.slots.at(9).bytes.reset();
    unread.decoded.image.params.at(139 - 1).raw.reset();
    unread.decoded.records.crcVerdict = desk::CrcVerdict::unreadable;
    PageUnit odd = fleetUnit("c", "M", "");
    odd.decoded.image.params.at(139 - 1).raw = 200;
    odd.decoded.versions.version = "";
    const std::string page = desk::pageText({fleetUnit("a", "M", "00000000"), unread, odd}, "ai");
    const std::string fleet = partOf(page, "<section id=\"fleet\"", "</section>");
    EXPECT_EQ(countOf(fleet, "default, not read"), 2U);
    EXPECT_TRUE(holds(fleet, "<td class=\"value\">00000000</td>"));
    EXPECT_TRUE(holds(fleet, "<td class=\"value fallback\">00000000\n"
                             "<span class=\"sign\">default, not read</span></td>"));
    EXPECT_TRUE(holds(fleet, "default, no model has code 200"));
    EXPECT_TRUE(holds(fleet, "<span class=\"sign\">empty</span>"));
    EXPECT_TRUE(holds(fleet, "<span class=\"sign\">none found</span>"));
    EXPECT_TRUE(holds(fleet, "<span class=\"sign\">unreadable</span>"));
}

TEST(PageTest, ImpactsOnOtherOutputsThanTheRunsAreLeftOut) {
    PageUnit unit = fleetUnit("a", "M", "1");
    unit.impacts = {{kit::paramKey(139), 17, 16, {{"/tmp/airplay.conf", 5}}},
                    {kit::paramKey(36), 17, 17, {{"/tmp/no-output-of-the-run", 2}}}};
    const std::string impacts = sectionOf(desk::pageText({unit}, "a"), "impacts");
    EXPECT_TRUE(holds(impacts, "param.139"));
    EXPECT_FALSE(holds(impacts, "param.36"));
    EXPECT_TRUE(holds(impacts, "1 input changes the lines below; 1 changes nothing."));
}

TEST(PageTest, ImpactsAreAMatrix) {
    PageUnit unit = fleetUnit("a", "M", "1");
    unit.impacts = {{kit::paramKey(139),
                     17,
                     16,
                     {{"/tmp/airplay.conf", 5}, {"/tmp/airplay.conf", 12}, {"/tmp/iap1.cfg", 0}}},
                    {kit::paramKey(1), 3, 0, {}}};
    const std::string page = desk::pageText({unit}, "ai");
    const std::string impacts = sectionOf(page, "impacts");
    EXPECT_EQ(countOf(partOf(impacts, "<thead>", "</thead>"), "<th>"), 4U);
    EXPECT_TRUE(holds(itemOf(impacts, "tr", "param.139"),
                      "<td>16 of 17</td>\n<td class=\"changed\">5, 12</td>"
                      "\n<td class=\"changed\">all</td>"));
    EXPECT_TRUE(holds(impacts, "1 input changes the lines below; 1 changes nothing."));
    EXPECT_FALSE(holds(desk::pageText({fleetUnit("a", "M", "1")}, "ai"), "class=\"impacts\""));
}

} // namespace

} // namespace orvane::test
