// SPDX-License-Identifier: Apache-2.0
//
// Reads that go wrong after a good open and a good seek, on any file system: calls of read in the
// tests' binary pass through here. Those inside a shared library, as of file streams, do not.
#pragma once

#include <cstddef>

namespace orvane::test {

/// While it lives, every read is disturbed.
class DisturbedReads {
public:
    /// Each fails, with EIO.
    static DisturbedReads failing() { return DisturbedReads(FAILING); }
    /// Each moves `most` bytes at most.
    static DisturbedReads ofAtMost(std::size_t most) { return DisturbedReads(most); }
    ~DisturbedReads();
    DisturbedReads(const DisturbedReads&) = delete;
    DisturbedReads& operator=(const DisturbedReads&) = delete;

    /// How many reads there were.
    static int count();

private:
    static constexpr std::size_t FAILING = 0;

    explicit DisturbedReads(std::size_t most);
};

} // namespace orvane::test
