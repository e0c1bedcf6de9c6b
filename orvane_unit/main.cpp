// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/command_line.h"

int main(int argc, char** argv) {
    return orvane::desk::runCommandLine(argc, argv);
}
