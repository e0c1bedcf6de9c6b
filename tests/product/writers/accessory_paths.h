// SPDX-License-Identifier: Apache-2.0
//
// An accessory file of no writer, for the tests of what all writers share.
#pragma once

#include "writers/template_merge.h"

namespace orvane::test {

constexpr char OUTPUT[] = "/tmp/output";
constexpr char TEMPLATE[] = "/fs/template";
constexpr char STOCK[] = "/fs/stock";
constexpr AccessoryFile ACCESSORY_FILE{OUTPUT, TEMPLATE, STOCK};

} // namespace orvane::test
