// SPDX-License-Identifier: Apache-2.0
//
// Memory that runs out at a chosen moment: the tests' binary has its own operator new.
#pragma once

namespace orvane::test {

/// How many allocations fail.
enum class Shortage { once, forGood };

/// While it lives, allocation number `first` (from 1) fails, either alone or with all later ones.
class FailingMemory {
public:
    FailingMemory(int first, Shortage shortage);
    ~FailingMemory();
    FailingMemory(const FailingMemory&) = delete;
    FailingMemory& operator=(const FailingMemory&) = delete;

    /// Whether an allocation has failed.
    static bool hasFailed();
};

} // namespace orvane::test
