/// What makes writing a host short. Header-only.
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

/// Characters from bytes, as the library reads names: in the locale "C", which every program starts
/// in, each byte is a character; in others the C library decides. Reads the process's locale, so no
/// other thread may set it meanwhile.
///
/// \throws std::system_error when the bytes are no text in this locale
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
                                    "no text in this locale: " + std::string(bytes));
        text += character;
        bytes.remove_prefix(length ? length : 1);
    }
    return text;
}

/// Where names are wide already.
inline std::wstring wideText(std::wstring_view text) {
    return std::wstring(text);
}

/// The name of a file in the characters that the library's operations take.
/// `std::filesystem::path::wstring` is no help: where names are bytes it knows ASCII alone.
///
/// \throws std::system_error when the name is no text in this locale
inline std::wstring wideName(const std::filesystem::path& file) {
    return wideText(file.native());
}

/// The search path that leads the component manager to this folder: its full name, without "." and
/// "..", which the manager deliberately does not resolve. Join several with L";", which therefore
/// cannot stand in a folder's name.
///
/// \throws std::system_error when the name is no text in this locale
inline std::wstring searchPath(const std::filesystem::path& folder) {
    return wideName(std::filesystem::absolute(folder).lexically_normal());
}

} // namespace Mz::Kit
