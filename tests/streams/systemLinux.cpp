// SPDX-License-Identifier: BSL-1.0
// The comma-decimal locale and the C library's formats on Linux.
#include "tests/streams/commaLocale.h"
#include "tests/streams/oracle.h"

#include <cstdarg>
#include <cstdlib>
#include <cwchar>

namespace Mz::Test {

bool setCommaLocale() {
    setenv("LOCPATH", MZ_LOCALE_FOLDER, 1);
    return std::setlocale(LC_ALL, "de_DE.UTF-8") != nullptr;
}

const bool oracleFollowsTheStandard = true;

namespace {

/// Converts a format to this C library's form: there, text is narrow unless it has the modifier
/// "l".
std::wstring translated(const wchar_t* format) {
    std::wstring result;
    for (bool directive = false; *format; ++format) {
        if (*format == L'%')
            directive = true;
        else if (directive && std::wcsncmp(format, L"I64", 3) == 0) {
            result += L"ll";
            format += 2;
            continue;
        } else if (directive && std::wcschr(L"diuoxXeEfFgGcs[n", *format)) {
            directive = false;
            if (std::wcschr(L"cs[", *format))
                result += L'l';
        }
        result += *format;
    }
    return result;
}

} // namespace

std::wstring oraclePrint(const wchar_t* format, ...) {
    wchar_t buffer[4096];
    std::va_list arguments;
    va_start(arguments, format);
    const int length = std::vswprintf(buffer, 4096, translated(format).c_str(), arguments);
    va_end(arguments);
    return {buffer, static_cast<std::size_t>(length < 0 ? 0 : length)};
}

int oracleScan(const std::wstring& input, const wchar_t* format, ...) {
    std::va_list arguments;
    va_start(arguments, format);
    const int assigned = std::vswscanf(input.c_str(), translated(format).c_str(), arguments);
    va_end(arguments);
    return assigned < 0 ? 0 : assigned;
}

} // namespace Mz::Test
