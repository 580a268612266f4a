/// Text formatted in the manner of the wide `printf`, alike on every platform and in every locale.
#pragma once

#include <cstdarg>
#include <string>

namespace Mz {

/// Appends to `result` what `format` makes of `arguments`: flags, width, precision and the sizes
/// `hh h l ll j z t L w I I32 I64` before `d i u o x X c C s S e E f F g G a A p n %`. Conventions
/// are those of Windows (wide `%s` and `%c`, a `long` of 32 bits, `%p` of 16 upper-case digits),
/// numbers those of the "C" locale with exponents of at least two digits. A null text is "(null)".
///
/// False when there is no such text: a `long` that does not fit 32 bits, or a '%' with nothing
/// behind it. What stands in `result` then means nothing. Throws `std::bad_alloc`.
bool formatText(std::wstring& result, const wchar_t* format, std::va_list& arguments);

} // namespace Mz
