// SPDX-License-Identifier: BSL-1.0
/// The formatter of the wide `printf` formats, equal on every platform and in every locale.
#pragma once

#include <cstdarg>
#include <string>

namespace Mz {

/// Appends the text of `arguments` in `format` to `result`.
///
/// A directive has flags, a width, a precision, a size of `hh h l ll j z t L w I I32 I64` and a
/// conversion of `d i u o x X c C s S e E f F g G a A p n %`. The conventions are those of Windows:
/// wide `%s` and `%c`, a `long` of 32 bits, `%p` of 16 upper-case digits. Numbers have the form of
/// the "C" locale, with exponents of at least two digits. A null string is "(null)".
///
/// \return false if a `long` does not fit 32 bits or the format ends after a '%'; the end of
///         `result` is undefined then
/// \throws std::bad_alloc
bool formatText(std::wstring& result, const wchar_t* format, std::va_list& arguments);

} // namespace Mz
