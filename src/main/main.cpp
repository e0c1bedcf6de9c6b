// SPDX-License-Identifier: Apache-2.0
#include "main/options.h"

int main(int argc, char* argv[]) {
    return orvane::runOptions(argc, argv);
}
