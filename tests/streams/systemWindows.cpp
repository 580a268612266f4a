// SPDX-License-Identifier: BSL-1.0
// The comma-decimal locale and the C library's formats on Windows.
#include "tests/streams/commaLocale.h"
#include "tests/streams/oracle.h"

#include <cstdarg>
#include <cstdio>
#include <cwchar>

namespace Mz::Test {

bool setCommaLocale() {
    return std::setlocale(LC_ALL, "German") != nullptr;
}

// Exponents have three digits. Some versions fill with zeros although there is a precision.
const bool oracleFollowsTheStandard = false;

std::wstring oraclePrint(const wchar_t* format, ...) {
    wchar_t buffer[4096];
    std::va_list arguments;
    va_start(arguments, format);
    const int length = ::_vsnwprintf(buffer, 4096, format, arguments);
    va_end(arguments);
    return {buffer, static_cast<std::size_t>(length < 0 ? 0 : length)};
}

int oracleScan(const std::wstring& input, const wchar_t* format, ...) {
    // The C library has no variant with a va_list. Pass the two pointers on.
    std::va_list arguments;
    va_start(arguments, format);
    void* const first = va_arg(arguments, void*);
    void* const second = va_arg(arguments, void*);
    va_end(arguments);
    const int assigned = ::_snwscanf(input.c_str(), input.size(), format, first, second);
    return assigned < 0 ? 0 : assigned;
}

} // namespace Mz::Test
