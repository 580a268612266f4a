/// The text of single numbers, in the forms in which streams write them.
#pragma once

#include <cstdarg>
#include <cstddef>

namespace Mz {

/// Long enough for every number here.
inline constexpr std::size_t longestNumberText = 40;

/// What `formatNumber` made of a format.
enum class NumberText {
    None,      ///< the format is none of a single number; no argument was taken
    Written,   ///< the number stands between the buffer's beginning and the end that is returned
    DoesNotFit ///< a `long` that does not fit 32 bits
};

/// Writes to `text` what `formatText` makes of the formats `%d %u %ld %lu %I64d %I64u %.9g %.16g`,
/// which are nearly all that streams are asked for, and moves `text` behind it.
NumberText formatNumber(char*& text, const wchar_t* format, std::va_list& arguments);

} // namespace Mz
