// SPDX-License-Identifier: BSL-1.0
// Counts the bytes that operator new allocates. The operators are in a file of their own, so that a
// compiler cannot inline one of a pair without the other.

#include "allocationCount.h"

#include <atomic>
#include <cstdlib>
#include <new>

namespace {

std::atomic<std::size_t> allocated = 0;

} // namespace

std::size_t Meshes::allocatedBytes() {
    return allocated;
}

void* operator new(std::size_t size) {
    allocated += size;
    if (void* memory = std::malloc(size > 0 ? size : 1))
        return memory;
    throw std::bad_alloc();
}

void operator delete(void* memory) noexcept {
    std::free(memory);
}

void operator delete(void* memory, std::size_t) noexcept {
    std::free(memory);
}
