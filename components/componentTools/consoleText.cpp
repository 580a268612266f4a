// SPDX-License-Identifier: BSL-1.0
/// Escapes control characters by itself; the encoding of the terminal and the arguments are left to
/// the platform layer.
#include "components/componentTools/consoleText.h"

#include "components/componentTools/platform/system.h"

#include <cstdint>

namespace Mz::Tools {

namespace {

bool isControl(wchar_t character) {
    const auto code = static_cast<std::uint32_t>(character); // A `wchar_t` may be negative.
    return code < 0x20 || (code >= 0x7F && code < 0xA0);
}

} // namespace

std::wstring withoutControls(const std::wstring& text, std::wstring_view keep) {
    constexpr const wchar_t* digits = L"0123456789ABCDEF";
    std::wstring result;
    for (const wchar_t character : text) {
        if (!isControl(character) || keep.find(character) != std::wstring_view::npos) {
            result += character;
        } else {
            result += L"\\x";
            result += digits[character >> 4];
            result += digits[character & 15];
        }
    }
    return result;
}

std::string forOutput(const std::wstring& text) {
    return System::encode(text, 1);
}

std::vector<std::string> argumentsOfProcess(int count, char** values) {
    return System::arguments(count, values);
}

std::filesystem::path pathOf(const std::string& argument) {
    return System::pathOfArgument(argument);
}

} // namespace Mz::Tools
