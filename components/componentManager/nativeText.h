/// Conversion between the wide text of the library's operations and the names of the system.
///
/// The component manager, its controllers and its importers take names as wide text. On Windows the
/// system's names are wide text, too. On Linux they are bytes, which convert as buffered IO
/// converts text:
/// - While LC_CTYPE of the calling thread is "C" or "POSIX", each byte is the character of the same
///   number. Every name has a wide form, and the conversion is reversible.
/// - In every other locale the C library decides. A name that is no text there has no wide form.
///
/// The locale is that of the calling thread (`uselocale`), or the process's if the thread has none.
/// It must not change during a call.
///
/// All functions may be called from any thread and throw nothing but `std::bad_alloc`.
#pragma once

#include "components/componentManager/export.h"

#include <filesystem>
#include <optional>
#include <string>
#include <string_view>

namespace Mz {

/// Returns `bytes` as wide text; nothing if they are no text in the locale. A NUL stays a NUL.
MZ_COMPONENT_MANAGER_API std::optional<std::wstring> toWide(std::string_view bytes);

/// Returns `text` in bytes; nothing if the locale has no form for one of the characters.
MZ_COMPONENT_MANAGER_API std::optional<std::string> toNarrow(std::wstring_view text);

/// Returns `text` in bytes, with `substitute` for each character that has no form in the locale.
MZ_COMPONENT_MANAGER_API std::string toNarrow(std::wstring_view text, char substitute);

/// Returns the name of a file as the library's operations take it; nothing if the name has no wide
/// form. `std::filesystem::path::wstring` is no substitute: on Linux it knows ASCII alone.
MZ_COMPONENT_MANAGER_API std::optional<std::wstring> toWideName(const std::filesystem::path& path);

/// Returns the file that the library opens by the name `name`; nothing if the locale has no form
/// for it. The reverse of `toWideName`.
MZ_COMPONENT_MANAGER_API std::optional<std::filesystem::path> toNativePath(std::wstring_view name);

/// Returns the name of a file for people, whatever it holds: bytes that have no wide form appear as
/// `\xNN`. Do not open a file by this text.
MZ_COMPONENT_MANAGER_API std::wstring displayName(const std::filesystem::path& path);

/// Returns the name of a file in UTF-8, as the reasons of exceptions contain it (`exceptions.h`).
/// Bytes that are no text appear as `\xNN`. In the "C" locale of Linux names are taken to be UTF-8.
///
///     throw QrStreamEx::ExReadOpen(source, __LINE__, utf8Name(file).c_str());
MZ_COMPONENT_MANAGER_API std::string utf8Name(const std::filesystem::path& path);

/// Returns UTF-8 text, such as an exception's reason, for people. Names in it appear as
/// `displayName` returns them: in the "C" locale of Linux each byte is a character, so that
/// `toNarrow` gives the same bytes again.
MZ_COMPONENT_MANAGER_API std::wstring displayText(std::string_view utf8);

} // namespace Mz
