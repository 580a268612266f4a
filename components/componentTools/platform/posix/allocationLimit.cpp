// SPDX-License-Identifier: BSL-1.0
/// Replaces `operator new` of the probe program. On Linux the libraries that it loads use these
/// functions, too, so that the checks can let their allocations fail. The limit is that of one
/// thread. The program installs it before `main`.
#include "components/componentTools/checking/allocationLimit.h"

#include <cstdlib>
#include <new>

namespace {

constexpr int unlimited = -1;
constinit thread_local int allowedAllocations = unlimited;
constinit thread_local bool anyFailed = false;

void* allocate(std::size_t size) noexcept {
    if (allowedAllocations == 0) {
        anyFailed = true;
        return nullptr;
    }
    if (allowedAllocations > 0)
        --allowedAllocations;
    return std::malloc(size ? size : 1);
}

void* allocateOrThrow(std::size_t size) {
    if (void* memory = allocate(size))
        return memory;
    throw std::bad_alloc();
}

void setLimit(int allowed) {
    if (allowed >= 0)
        anyFailed = false;
    allowedAllocations = allowed;
}

bool wasReached() {
    return anyFailed;
}

constexpr Mz::Tools::AllocationLimit limit{setLimit, wasReached};

struct Installed {
    Installed() { Mz::Tools::setAllocationLimit(&limit); }
} installed;

} // namespace

void* operator new(std::size_t size) {
    return allocateOrThrow(size);
}
void* operator new[](std::size_t size) {
    return allocateOrThrow(size);
}
void* operator new(std::size_t size, const std::nothrow_t&) noexcept {
    return allocate(size);
}
void* operator new[](std::size_t size, const std::nothrow_t&) noexcept {
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
