// SPDX-License-Identifier: BSL-1.0
// Replaces the program's operator new by one that throws once a thread has used up its allocations.
#include "tests/unit/allocationFailure.h"

#include <cstdlib>
#include <new>

namespace {

constexpr int unlimited = -1;
constinit thread_local int allowedAllocations = unlimited;

void* allocate(std::size_t size) {
    if (allowedAllocations == 0)
        throw std::bad_alloc();
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

FailingAllocations::FailingAllocations(int allowed) {
    allowedAllocations = allowed;
}

FailingAllocations::~FailingAllocations() {
    allowedAllocations = unlimited;
}

} // namespace Mz::Test
