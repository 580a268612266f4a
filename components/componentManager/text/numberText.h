// SPDX-License-Identifier: BSL-1.0
/// The fast formatter for single numbers in the formats of the streams' operators.
#pragma once

#include "components/componentManager/uid.h"

#include <cstdarg>
#include <cstddef>

namespace Mz {

/// The size of a buffer that has room for every number here.
inline constexpr std::size_t longestNumberText = 40;

/// The result of `formatNumber`.
enum class NumberText {
    None,      ///< The format is not one of these. No argument was taken.
    Written,   ///< The number was written.
    DoesNotFit ///< The argument is a `long` that does not fit 32 bits.
};

/// Writes the text that `formatText` returns for one of the formats `%d %u %ld %lu %I64d %I64u %.9g
/// %.16g`, which are nearly all that streams use, to `text` and moves `text` to its end. `text`
/// must have room for `longestNumberText` characters; those after the number remain as they are.
NumberText formatNumber(char*& text, const wchar_t* format, std::va_list& arguments);

/// Writes what `formatNumber` writes for `%d`, `%u`, `%I64d`, `%I64u` and `%.16g`, and returns its
/// end.
char* writeNumberText(char* text, int value);
char* writeNumberText(char* text, unsigned int value);
char* writeNumberText(char* text, int64 value);
char* writeNumberText(char* text, unsigned long long value);
char* writeNumberText(char* text, double value);

} // namespace Mz
