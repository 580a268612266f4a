// SPDX-License-Identifier: BSL-1.0
/// What the component that calls `exit` and its host agree on.
#pragma once

#include "components/componentManager/cast.h"
#include "tests/components/plain.h"

namespace Mz::Test {

inline constexpr QrUid exitingUid = testUid(0x40001);
inline constexpr QrUid exitingImporterUid = testUid(0x40002);

/// The environment variable that names the place where the component calls `exit`.
inline constexpr const char* exitPlace = "MZ_TEST_EXIT_AT";

/// The status with which it does.
inline constexpr int exitStatus = 43;

} // namespace Mz::Test
