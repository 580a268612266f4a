// SPDX-License-Identifier: BSL-1.0
/// Names and search paths in the form that the library takes.
///
///     const auto plugins = Mz::Kit::programFolder() / "plugins";
///     QrGetComponentManager()->initialize(Mz::Kit::searchPath(plugins).c_str());
///
/// \since 0.2
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

/// Returns `bytes` as wide characters, converted as the library converts names: by the locale of
/// the calling thread. In the locale "C", in which every program starts, and in "POSIX", each byte
/// is one character.
///
/// \throws std::system_error  if the bytes are not valid text in this locale
inline std::wstring wideText(std::string_view bytes) {
    if (std::optional<std::wstring> text = toWide(bytes))
        return *std::move(text);
    throw std::system_error(std::make_error_code(std::errc::illegal_byte_sequence),
                            "not valid text in this locale: " + std::string(bytes));
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

/// Returns the search path for one folder: its full name, without "." and "..". The component
/// manager deliberately does not resolve these.
///
/// Join several search paths with L";". The name of a folder must therefore not contain a ";".
///
/// \throws std::system_error  if the name is not valid text in this locale
/// \throws std::filesystem::filesystem_error  if `folder` is relative and the current folder is
///     gone
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
