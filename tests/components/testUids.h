// SPDX-License-Identifier: BSL-1.0
/// The uids of the builders of the test components.
#pragma once

#include "tests/components/plain.h"

namespace Mz::Test {

inline constexpr QrUid goodUid = testUid(1);
inline constexpr QrUid goodSecondUid = testUid(2);
inline constexpr QrUid goodThirdUid = testUid(3);
inline constexpr QrUid kitUid = testUid(4);
inline constexpr QrUid countedUid = testUid(5);
inline constexpr QrUid changingUid = testUid(6);
inline constexpr QrUid sharedUid = testUid(7);
inline constexpr QrUid firstSharerUid = testUid(8);
inline constexpr QrUid secondSharerUid = testUid(9);
inline constexpr QrUid duplicateUid = testUid(10);
inline constexpr QrUid createsNullUid = testUid(11);
inline constexpr QrUid createsWrongUid = testUid(12);
inline constexpr QrUid createThrowsUid = testUid(13);
inline constexpr QrUid translatedUid = testUid(14);
inline constexpr QrUid nullTextsUid = testUid(15);
inline constexpr QrUid reentrantUid = testUid(16);
inline constexpr QrUid reentrantInitialiserUid = testUid(17);
inline constexpr QrUid finaliserUid = testUid(18);
inline constexpr QrUid manifestUid = testUid(19);
inline constexpr QrUid faultyUid = testUid(20); ///< for libraries whose builders must be dropped
inline constexpr QrUid changingSecondUid = testUid(21);
inline constexpr QrUid exitsUid = testUid(22);
inline constexpr QrUid asksUid = testUid(23);
inline constexpr QrUid asksCountedUid = testUid(24);
inline constexpr std::uint32_t firstOfMany = 0x10000;
inline constexpr std::uint32_t howMany = 5000;
inline constexpr std::uint32_t firstOfMiscounted = 0x20000;
inline constexpr std::uint32_t howManyMiscounted = 40;

} // namespace Mz::Test
