// SPDX-License-Identifier: Apache-2.0
#include "tests/support/failing_memory.h"

#include <cstdlib>
#include <new>

namespace orvane::test {

namespace {

// NOLINTBEGIN(cppcoreguidelines-avoid-non-const-global-variables): operator new has no object
int untilFailure = 0; // 0: no shortage
bool isForGood = false;
bool wasHit = false;
// NOLINTEND(cppcoreguidelines-avoid-non-const-global-variables)

bool isDue() {
    if (untilFailure == 0 || --untilFailure != 0) {
        return false;
    }
    untilFailure = isForGood ? 1 : 0;
    wasHit = true;
    return true;
}

} // namespace

FailingMemory::FailingMemory(int first, Shortage shortage) {
    isForGood = shortage == Shortage::forGood;
    wasHit = false;
    untilFailure = first;
}

FailingMemory::~FailingMemory() {
    untilFailure = 0;
}

bool FailingMemory::hasFailed() {
    return wasHit;
}

static bool mustAllocationFail() {
    return isDue();
}

} // namespace orvane::test

void* operator new(std::size_t size, const std::nothrow_t& /*tag*/) noexcept {
    const bool mustFail = orvane::test::mustAllocationFail();
    return mustFail ? nullptr : std::malloc(size == 0 ? 1 : size);
}

void* operator new(std::size_t size) {
    void* const memory = operator new(size, std::nothrow);
    if (memory == nullptr) {
        throw std::bad_alloc();
    }
    return memory;
}

void operator delete(void* memory) noexcept {
    std::free(memory);
}

void operator delete(void* memory, std::size_t /*size*/) noexcept {
    std::free(memory);
}
