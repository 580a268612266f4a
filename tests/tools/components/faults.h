// SPDX-License-Identifier: BSL-1.0
/// Faults of component libraries.
#pragma once

#include <cstdint>

namespace Mz::Test {

/// Writes to an address without memory.
inline int crash() {
    static volatile std::uintptr_t nowhere = 64;
    *reinterpret_cast<volatile int*>(nowhere) = 1;
    return 0;
}

} // namespace Mz::Test
