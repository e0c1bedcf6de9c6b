// SPDX-License-Identifier: Apache-2.0
#include "main/options.h"

// The usage record, which the platform's `use` utility reads from the executable; the program never
// prints it. The section has no flags, so it is not loaded into memory. Its bytes are just the
// text, without a terminating NUL. `-i` comes first, as in the option string. It is next to main,
// which every link keeps: nothing refers to it, so in a file of its own it would be dropped with
// the unused sections.
asm(".pushsection QNX_usage,\"\",%progbits\n"
    ".ascii \"Usage: orvane <options>\\r\\n\"\n"
    ".ascii \"\\r\\n\"\n"
    ".ascii \"Options:\\r\\n\"\n"
    ".ascii \"  -i -- Update iAP config files\\r\\n\"\n"
    ".ascii \"  -a -- Update airplay config file\\r\\n\"\n"
    ".ascii \"\\r\\n\"\n"
    ".popsection\n");

int main(int argc, char* argv[]) {
    return orvane::runOptions(argc, argv);
}
