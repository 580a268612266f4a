// SPDX-License-Identifier: BSL-1.0
/// The C library's own wide printer and scanner, with the conventions of our formats.
#pragma once

#include <string>

namespace Mz::Test {

/// What the C library makes of the format: that of the wide `printf`, with wide text.
std::wstring oraclePrint(const wchar_t* format, ...);

/// What the C library's wide scanner assigns, through exactly two pointers; the end of input counts
/// as nothing.
int oracleScan(const std::wstring& input, const wchar_t* format, ...);

/// Whether the C library writes and reads as the standard has it throughout; else real numbers, and
/// integers filled with zeros, are left out.
extern const bool oracleFollowsTheStandard;

} // namespace Mz::Test
