// SPDX-License-Identifier: BSL-1.0
/// The uids of the builders in the libraries for the tests of recorded lists.
#pragma once

#include "components/componentManager/uid.h"

namespace Mz::Test {

inline constexpr QrUid recordedAlpha{0x5B6F1A01, 0x2D3E4C5B, 0x9A8B7C6D, 0x10203040};
inline constexpr QrUid recordedBeta{0x5B6F1A02, 0x2D3E4C5B, 0x9A8B7C6D, 0x10203040};
inline constexpr QrUid recordedGamma{0x5B6F1A03, 0x2D3E4C5B, 0x9A8B7C6D, 0x10203040};

} // namespace Mz::Test
