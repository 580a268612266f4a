// SPDX-License-Identifier: BSL-1.0
/// The C library's wide printf and scanf, used as an oracle for this library's formats.
#pragma once

#include <string>

namespace Mz::Test {

/// Formats with the C library's wide printf. Text is wide.
std::wstring oraclePrint(const wchar_t* format, ...);

/// Scans with the C library's wide scanner, with exactly two pointers. Returns the number of values
/// assigned, 0 at the end of input.
int oracleScan(const std::wstring& input, const wchar_t* format, ...);

/// Whether the C library follows the standard everywhere. If not, the tests omit real numbers and
/// integers filled with zeros.
extern const bool oracleFollowsTheStandard;

} // namespace Mz::Test
