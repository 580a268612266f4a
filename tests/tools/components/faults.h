// SPDX-License-Identifier: BSL-1.0
/// What a component library must not do to its host.
#pragma once

#include <cstdint>

namespace Mz::Test {

/// Writes where no memory is.
inline int crash() {
    static volatile std::uintptr_t nowhere = 64;
    *reinterpret_cast<volatile int*>(nowhere) = 1;
    return 0;
}

} // namespace Mz::Test
