// SPDX-License-Identifier: Apache-2.0
//
// What a description must not contain about image and disk, and the messages.
#include "tests/kit/description/description_refusal.h"

#include <gtest/gtest.h>

namespace orvane::test {

namespace {

const DescriptionRefusal REFUSALS[] = {
    {"[{\n", "unit.toml:1:2: Error while parsing key: expected bare key starting character or "
             "string delimiter, saw '{'"},
    {"\xC3\xA9 = 1\n", "unit.toml:1:1: Error while parsing root table: expected keys, tables, "
                       "whitespace or comments, saw '\xC3\xA9'"},
    {"aux = \xC3\xA9\n",
     "unit.toml:1:7: Error while parsing value: could not determine value type"},
    {"aux = 1\xC3\xA9\n",
     "unit.toml:1:8: Error while parsing decimal integer: expected digit, saw '\xC3\xA9'"},
    {"[imago]\n", "unit.toml:1:2: unknown key \"imago\" in a unit: it takes folders, absent, "
                  "image, disk, files, links"},
    {"[image]\nsize = -1\n",
     "unit.toml:2:8: the image's size must be from 0 to 4294967295: -1 does not fit"},
    {"[image]\nsize = 4294967296\n",
     "unit.toml:2:8: the image's size must be from 0 to 4294967295: 4294967296 does not fit"},
    {"[image]\nsize = \"179\"\n",
     "unit.toml:2:8: the image's size must be a whole number, not \"179\""},
    {"[image]\nparam = 5\n",
     "unit.toml:2:1: unknown key \"param\" in [image]: it takes size, params, bytes"},
    {"image = 5\n", "unit.toml:1:9: \"image\" must be a table, not 5"},
    {"[image]\nparams = [22, 1]\n", "unit.toml:2:10: \"params\" must be a table, not a list"},
    {"[image.params]\n0 = 1\n",
     "unit.toml:2:1: a parameter number must be from 1 to 171, not \"0\""},
    {"[image.params]\n172 = 1\n",
     "unit.toml:2:1: a parameter number must be from 1 to 171, not \"172\""},
    {"[image.params]\n22x = 1\n",
     "unit.toml:2:1: a parameter number must be from 1 to 171, not \"22x\""},
    {"[image.params]\n0x = 1\n",
     "unit.toml:2:1: a parameter number must be from 1 to 171, not \"0x\""},
    {"[image.params]\n-1 = 1\n",
     "unit.toml:2:1: a parameter number must be from 1 to 171, not \"-1\""},
    {"[image.params]\n99999999999999999999 = 1\n",
     "unit.toml:2:1: a parameter number must be from 1 to 171, not \"99999999999999999999\""},
    {"[image.params]\n22 = 256\n", "unit.toml:2:6: parameter 22 is one byte: 256 does not fit"},
    {"[image.params]\n22 = -1\n", "unit.toml:2:6: parameter 22 is one byte: -1 does not fit"},
    {"[image.params]\n134 = 70000\n",
     "unit.toml:2:7: parameter 134 is two bytes: 70000 does not fit"},
    {"[image.params]\n134 = \"x\"\n",
     "unit.toml:2:7: parameter 134 must be a whole number, not \"x\""},
    {"[image.params]\n134 = 1.5\n", "unit.toml:2:7: parameter 134 must be a whole number, not 1.5"},
    {"[image.params]\n134 = [1]\n",
     "unit.toml:2:7: parameter 134 must be a whole number, not a list"},
    {"[image.params]\n134 = {}\n",
     "unit.toml:2:7: parameter 134 must be a whole number, not a table"},
    {"[image.params]\n134 = 1979-05-27\n",
     "unit.toml:2:7: parameter 134 must be a whole number, not 1979-05-27"},
    {"[image.params]\n134 = true\n",
     "unit.toml:2:7: parameter 134 must be a whole number, not true"},
    {"[image.params]\n22 = 1\n0x16 = 1\n", "unit.toml:2:1: parameter 22 is given twice"},
    {"[image]\nsize = 134\n[image.params]\n134 = 1\n",
     "unit.toml:4:1: parameter 134 ends at byte 135 of an image of 134 bytes"},
    {"[image.bytes]\n139 = \"4\"\n",
     "unit.toml:2:7: the content at 139: hex needs two digits a byte: \"4\" has an odd number"},
    {"[image.bytes]\n139 = \"zz\"\n",
     "unit.toml:2:7: the content at 139: hex has the digits 0-9 and a-f: \"zz\" is not a byte"},
    {"[image.bytes]\n139 = 5\n",
     "unit.toml:2:7: the content at 139 must be a text in quotes, not 5"},
    {"[image.bytes]\nx = \"41\"\n",
     "unit.toml:2:1: an offset must be from 0 to 4294967295, not \"x\""},
    {"[image.bytes]\n4294967296 = \"41\"\n",
     "unit.toml:2:1: an offset must be from 0 to 4294967295, not \"4294967296\""},
    {"[image.bytes]\n178 = \"4142\"\n",
     "unit.toml:2:1: the content at 178 ends at byte 180 of an image of 179 bytes"},
    {"[image.bytes]\n1 = \"41\"\n0x1 = \"41\"\n", "unit.toml:2:1: the content at 1 is given twice"},
    {"[disk]\nsize = -1\n",
     "unit.toml:2:8: the disk's size must be from 0 to 9223372036854775807: -1 does not fit"},
    {"[disk]\nsize = 1e3\n", "unit.toml:2:8: the disk's size must be a whole number, not 1000.0"},
    {"[disk]\nslot = 1\n",
     "unit.toml:2:1: unknown key \"slot\" in [disk]: it takes size, slots, aux, tuning, bytes"},
    {"[disk]\naux = 1\n", "unit.toml:2:7: aux must be a text in quotes, not 1"},
    {"[disk]\naux = \"\"\n", "unit.toml:2:7: the auxiliary area takes 1 to 1024 bytes, not 0"},
    {"[disk]\naux = \"hex:4\"\n",
     "unit.toml:2:7: aux: hex needs two digits a byte: \"4\" has an odd number"},
    {"[disk.slots]\n18 = \"x\"\n", "unit.toml:2:1: a slot number must be from 0 to 17, not \"18\""},
    {"[disk.slots]\n9 = \"123456789\"\n", "unit.toml:2:5: slot 9 takes 1 to 8 bytes, not 9"},
    {"[disk.slots]\n9 = \"\"\n", "unit.toml:2:5: slot 9 takes 1 to 8 bytes, not 0"},
    {"[disk.slots]\n9 = \"hex:\"\n", "unit.toml:2:5: slot 9 takes 1 to 8 bytes, not 0"},
    {"[disk.slots]\n9 = \"hex:4z\"\n",
     "unit.toml:2:5: slot 9: hex has the digits 0-9 and a-f: \"4z\" is not a byte"},
    {"[disk.slots]\n9 = 1\n", "unit.toml:2:5: slot 9 must be a text in quotes, not 1"},
    {"[disk.slots]\n9 = \"a\"\n0x9 = \"b\"\n", "unit.toml:2:1: slot 9 is given twice"},
    {"[disk]\nsize = 10\n[disk.slots]\n9 = \"a\"\n",
     "unit.toml:4:1: slot 9 does not fit on a disk of 10 bytes: it needs 1048447"},
    {"[disk]\nsize = 10\n[disk.tuning.3]\n",
     "unit.toml:3:14: the tuning area does not fit on a disk of 10 bytes: it needs 1044480"},
    {"[disk.bytes]\n2097151 = \"4142\"\n",
     "unit.toml:2:1: the content at 2097151 ends at byte 2097153 of a disk of 2097152 bytes"},
    {"[disk.bytes]\n9223372036854775808 = \"41\"\n",
     "unit.toml:2:1: an offset must be from 0 to 9223372036854775807, not \"9223372036854775808\""},
    {"[disk]\nbytes = \"x\"\n", "unit.toml:2:9: \"bytes\" must be a table, not \"x\""},
    {"[disk.tuning.10]\n", "unit.toml:1:14: a tuning block must be from 0 to 9, not \"10\""},
    {"[disk.tuning.x]\n", "unit.toml:1:14: a tuning block must be from 0 to 9, not \"x\""},
    {"[disk.tuning]\n3 = 1\n", "unit.toml:2:5: \"3\" must be a table, not 1"},
    {"[disk.tuning.3]\n[disk.tuning.0x3]\n", "unit.toml:1:14: tuning block 3 is given twice"},
    {"[disk.tuning.2]\nqwaNone = 1\n",
     "unit.toml:2:1: unknown key \"qwaNone\" in tuning block 2: it takes raw and the 44 keys of a "
     "tuning file, such as qwaAECSwitch"},
    {"[disk.tuning.2]\nqwaAECSwitch = \"on\"\n",
     "unit.toml:2:16: qwaAECSwitch has no word \"on\": it takes qwaOff, qwaOn, qwaIdle, or a code "
     "0 to 3"},
    {"[disk.tuning.2]\nqwaAECSwitch = 4\n",
     "unit.toml:2:16: qwaAECSwitch takes 0 to 3: 4 does not fit"},
    {"[disk.tuning.2]\nqwaAECSwitch = [1]\n",
     "unit.toml:2:16: qwaAECSwitch takes one value, not a list"},
    {"[disk.tuning.2]\nqwaAECSwitch = true\n", "unit.toml:2:16: qwaAECSwitch must be a word, a "
                                               "whole number or a list of whole numbers, not true"},
    {"[disk.tuning.2]\nqwaNRAtten = 32768\n",
     "unit.toml:2:14: qwaNRAtten takes -32768 to 32767: 32768 does not fit"},
    {"[disk.tuning.2]\nqwaNRAtten = \"qwaOn\"\n",
     "unit.toml:2:14: qwaNRAtten takes numbers, not the word \"qwaOn\""},
    {"[disk.tuning.2]\nqwaNCParams = [1, 2]\n",
     "unit.toml:2:15: qwaNCParams takes 5 numbers, not 2"},
    {"[disk.tuning.2]\nqwaNCParams = 1\n",
     "unit.toml:2:15: qwaNCParams takes a list of 5 numbers, not 1"},
    {"[disk.tuning.2]\nqwaNCParams = [1, 2, 3, 4, \"x\"]\n",
     "unit.toml:2:28: an element of qwaNCParams must be a whole number, not \"x\""},
    {"[disk.tuning.2]\nraw = \"4\"\n",
     "unit.toml:2:7: raw: hex needs two digits a byte: \"4\" has an odd number"},
    {"[disk.tuning.2]\nraw = 4\n", "unit.toml:2:7: raw must be a text in quotes, not 4"},
    {"a = 1\na = 2\n",
     "unit.toml:2:5: Error while parsing key-value pair: cannot redefine existing integer 'a'"},
};

TEST(DescriptionValues, RefusalNamesPlaceKeyValueAndWhatWouldBeRight) {
    for (const DescriptionRefusal& refusal : REFUSALS) {
        expectRefused(refusal);
    }
}

} // namespace

} // namespace orvane::test
