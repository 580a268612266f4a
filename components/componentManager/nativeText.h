// SPDX-License-Identifier: BSL-1.0
/// Conversions between the wide names of the library's functions and the system's file names.
///
/// The component manager, its controllers and its importers take names as wide text. On Windows the
/// system's names are wide text, too. On Linux they are bytes, which are converted as buffered IO
/// converts text:
/// - While LC_CTYPE of the calling thread is "C" or "POSIX", each byte is the character of the same
///   value. Every name has a wide form, and the conversion is reversible.
/// - In every other locale the C library converts. A name that is invalid in the locale's encoding
///   has no wide form.
///
/// The locale is that of the calling thread (`uselocale`), or the process's if the thread has none.
/// It must not change during a call.
///
/// All functions may be called from any thread and throw `std::bad_alloc` only.
///
/// \since 0.2
#pragma once

#include "components/componentManager/export.h"

#include <filesystem>
#include <optional>
#include <string>
#include <string_view>

namespace Mz {

/// Returns `text`, or an empty text if it is null. Component libraries may pass null for an empty
/// text.
inline const wchar_t* textOrEmpty(const wchar_t* text) {
    return text ? text : L"";
}

/// Returns `bytes` as wide text; `std::nullopt` if they are invalid in the locale's encoding. A NUL
/// stays a NUL.
MZ_COMPONENT_MANAGER_API std::optional<std::wstring> toWide(std::string_view bytes);

/// Returns `text` as bytes; `std::nullopt` if the locale cannot represent one of the characters.
MZ_COMPONENT_MANAGER_API std::optional<std::string> toNarrow(std::wstring_view text);

/// Returns `text` as bytes, with `substitute` for each character that the locale cannot represent.
MZ_COMPONENT_MANAGER_API std::string toNarrow(std::wstring_view text, char substitute);

/// Returns the name of a file in the form that the library's functions take; `std::nullopt` if it
/// has no wide form. `std::filesystem::path::wstring` is no substitute: on Linux it converts only
/// ASCII.
MZ_COMPONENT_MANAGER_API std::optional<std::wstring> toWideName(const std::filesystem::path& path);

/// Returns the path that the library opens for the name `name`; `std::nullopt` if the locale cannot
/// represent the name. The reverse of `toWideName`.
MZ_COMPONENT_MANAGER_API std::optional<std::filesystem::path> toNativePath(std::wstring_view name);

/// Returns the name of any file, for people. Bytes that have no wide form appear as `\xNN`. Do not
/// open a file by this text.
MZ_COMPONENT_MANAGER_API std::wstring displayName(const std::filesystem::path& path);

/// Returns the name of a file in UTF-8, the form for the reasons of exceptions (`exceptions.h`).
/// Invalid bytes appear as `\xNN`. In the "C" locale of Linux the name is taken to be in UTF-8.
///
///     throw QrStreamEx::ExReadOpen(source, __LINE__, utf8Name(file).c_str());
MZ_COMPONENT_MANAGER_API std::string utf8Name(const std::filesystem::path& path);

/// Returns UTF-8 text, such as an exception's reason, as wide text for people. File names in it
/// appear as `displayName` returns them: in the "C" locale of Linux each byte is a character, so
/// that `toNarrow` returns the same bytes.
MZ_COMPONENT_MANAGER_API std::wstring displayText(std::string_view utf8);

} // namespace Mz
