// SPDX-License-Identifier: Apache-2.0
#include "tests/support/disturbed_reads.h"

#include <sys/types.h>

#include <algorithm>
#include <cerrno>

namespace orvane::test {

namespace {

// NOLINTBEGIN(cppcoreguidelines-avoid-non-const-global-variables): a call of read has no object
bool isDisturbed = false;
std::size_t mostBytes = 0; // 0: fails
int readCount = 0;
// NOLINTEND(cppcoreguidelines-avoid-non-const-global-variables)

} // namespace

DisturbedReads::DisturbedReads(std::size_t most) {
    isDisturbed = true;
    mostBytes = most;
    readCount = 0;
}

DisturbedReads::~DisturbedReads() {
    isDisturbed = false;
}

int DisturbedReads::count() {
    return readCount;
}

/// The bytes that a read of `length` asks for; 0 when it fails instead.
static std::size_t bytesToRead(std::size_t length) {
    if (!isDisturbed) {
        return length;
    }
    ++readCount;
    return std::min(length, mostBytes);
}

} // namespace orvane::test

// The names that the linker's option --wrap=read gives to the calls, and to what they would call.
// NOLINTBEGIN(bugprone-reserved-identifier)
extern "C" ssize_t __real_read(int descriptor, void* buffer, std::size_t length);

extern "C" ssize_t __wrap_read(int descriptor, void* buffer, std::size_t length) {
    const std::size_t bytes = orvane::test::bytesToRead(length);
    if (bytes == 0 && length != 0) {
        errno = EIO;
        return -1;
    }
    return __real_read(descriptor, buffer, bytes);
}
// NOLINTEND(bugprone-reserved-identifier)
