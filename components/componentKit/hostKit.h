/// What makes writing a host short. Header-only.
///
///     const auto plugins = Mz::Kit::programFolder() / "plugins";
///     QrGetComponentManager()->initialize(Mz::Kit::searchPath(plugins).c_str());
#pragma once

#include "components/componentManager/files.h"
#include "components/componentManager/nativeText.h"

#include <filesystem>
#include <optional>
#include <string>
#include <string_view>
#include <system_error>
#include <utility>

namespace Mz::Kit {

/// Returns `bytes` as wide text, converted as the library converts names: by the locale of the
/// calling thread, and byte by byte in the locale "C", which every program starts in.
///
/// \throws std::system_error if the bytes are no text in this locale
inline std::wstring wideText(std::string_view bytes) {
    if (std::optional<std::wstring> text = toWide(bytes))
        return *std::move(text);
    throw std::system_error(std::make_error_code(std::errc::illegal_byte_sequence),
                            "no text in this locale: " + std::string(bytes));
}

/// Returns `text`: where names are wide, nothing needs converting.
inline std::wstring wideText(std::wstring_view text) {
    return std::wstring(text);
}

/// Returns the name of a file as the library's operations take it. `std::filesystem::path::wstring`
/// is no substitute: on Linux it knows ASCII alone.
///
/// \throws std::system_error if the name is no text in this locale
inline std::wstring wideName(const std::filesystem::path& file) {
    return wideText(file.native());
}

/// Returns the search path that leads the component manager to this folder: its full name, without
/// "." and "..", which the manager deliberately does not resolve. Join several with L";", which
/// therefore cannot be part of a folder's name.
///
/// \throws std::system_error if the name is no text in this locale
/// \throws std::filesystem::filesystem_error if `folder` is relative and the current folder is gone
inline std::wstring searchPath(const std::filesystem::path& folder) {
    return wideName(fullPath(folder));
}

/// Returns the folder of the running program's file. The system is asked for it, so that it is
/// right however the program was started.
///
/// Use it to name the folder of your components. With a null search path the manager takes the
/// program's folder from the first element of the command line, which is the current folder when
/// the program was started by its bare name.
///
/// \throws std::system_error if the system does not know it
inline std::filesystem::path programFolder() {
    return Mz::programFolder();
}

} // namespace Mz::Kit
