/// Functions that prepare names and search paths for the library. Header-only.
///
///     QrGetComponentManager()->initialize(Mz::Kit::searchPath("plugins").c_str());
#pragma once

#include <clocale>
#include <cwchar>
#include <filesystem>
#include <string>
#include <string_view>
#include <system_error>

namespace Mz::Kit {

/// Returns `bytes` as wide characters, converted as the library converts file names.
///
/// In the locale "C", in which every program starts, and in "POSIX", each byte is one character. In
/// other locales the C library converts. The function reads the locale of the process, so no other
/// thread may set the locale at the same time.
///
/// \throws std::system_error  if the bytes are not valid text in this locale
inline std::wstring wideText(std::string_view bytes) {
    const char* const locale = std::setlocale(LC_CTYPE, nullptr);
    const std::string_view name = locale ? locale : "C";
    std::wstring text;
    text.reserve(bytes.size());
    std::mbstate_t state{};
    while (!bytes.empty()) {
        wchar_t character = static_cast<unsigned char>(bytes.front());
        std::size_t length = 1;
        if (name != "C" && name != "POSIX")
            length = std::mbrtowc(&character, bytes.data(), bytes.size(), &state);
        if (length > bytes.size()) // Rejected, or incomplete.
            throw std::system_error(std::make_error_code(std::errc::illegal_byte_sequence),
                                    "not valid text in this locale: " + std::string(bytes));
        text += character;
        bytes.remove_prefix(length ? length : 1);
    }
    return text;
}

/// Returns a copy of `text`, for platforms whose file names are wide already.
inline std::wstring wideText(std::wstring_view text) {
    return std::wstring(text);
}

/// Returns the name of a file in the wide characters that the library takes.
///
/// Do not use `std::filesystem::path::wstring` for this: where file names are bytes, it converts
/// ASCII only.
///
/// \throws std::system_error  if the name is not valid text in this locale
inline std::wstring wideName(const std::filesystem::path& file) {
    return wideText(file.native());
}

/// Returns the search path for one folder: its absolute name, without "." and "..". The component
/// manager deliberately does not resolve these.
///
/// Join several search paths with L";". The name of a folder must therefore not contain a ";".
///
/// \throws std::system_error  if the name is not valid text in this locale
/// \throws std::filesystem::filesystem_error  if the current directory cannot be determined
inline std::wstring searchPath(const std::filesystem::path& folder) {
    return wideName(std::filesystem::absolute(folder).lexically_normal());
}

} // namespace Mz::Kit
