// SPDX-License-Identifier: BSL-1.0
// Replaces the program's operator new by one that throws once a thread has used up its allocations.
// The operators are in a file of their own, so that a compiler cannot inline one of a pair without
// the other.
#include "tests/support/failingAllocations.h"

#include "tests/support/journal.h"

#include <cstdlib>

namespace {

constexpr int unlimited = -1;
constinit thread_local int allowedAllocations = unlimited;
constinit thread_local bool onlyOneFails = false;
constinit thread_local bool anyFailed = false;

void* allocate(std::size_t size) {
    if (allowedAllocations == 0) {
        anyFailed = true;
        if (onlyOneFails)
            allowedAllocations = unlimited;
        throw std::bad_alloc();
    }
    if (allowedAllocations > 0)
        --allowedAllocations;
    if (void* memory = std::malloc(size ? size : 1))
        return memory;
    throw std::bad_alloc();
}

} // namespace

void* operator new(std::size_t size) {
    return allocate(size);
}
void* operator new[](std::size_t size) {
    return allocate(size);
}
void operator delete(void* memory) noexcept {
    std::free(memory);
}
void operator delete[](void* memory) noexcept {
    std::free(memory);
}
void operator delete(void* memory, std::size_t) noexcept {
    std::free(memory);
}
void operator delete[](void* memory, std::size_t) noexcept {
    std::free(memory);
}

namespace Mz::Test {

FailingAllocations::FailingAllocations(int allowed, Which which) {
    anyFailed = false;
    onlyOneFails = which == Which::one;
    allowedAllocations = allowed;
}

FailingAllocations::~FailingAllocations() {
    allowedAllocations = unlimited;
}

bool FailingAllocations::failed() const {
    return anyFailed;
}

int leastFailures(int count) {
    // Whether an allocation in a library fails: that of the journal for a long text.
    const FailingAllocations failing(0);
    try {
        setSearchPathUnderTest(L"a text that is too long for the buffer in a string");
    } catch (const std::bad_alloc&) { // NOLINT(bugprone-empty-catch)
    }
    return failing.failed() ? count : 0;
}

} // namespace Mz::Test
