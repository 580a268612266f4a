/// UTF-8, for text that must be the same in every locale.
#pragma once

#include "components/componentManager/export.h"

#include <string>
#include <string_view>

namespace Mz {

/// Returns `text` in UTF-8. Surrogate pairs are joined on every platform; what is no character
/// becomes U+FFFD.
///
/// Depends on no locale. May be called from any thread. Throws nothing but `std::bad_alloc`.
MZ_COMPONENT_MANAGER_API std::string toUtf8(std::wstring_view text);

/// Returns UTF-8 as wide text, with surrogate pairs where `wchar_t` has 16 bits. Each byte that
/// begins no valid sequence becomes U+FFFD.
///
/// Depends on no locale. May be called from any thread. Throws nothing but `std::bad_alloc`.
MZ_COMPONENT_MANAGER_API std::wstring fromUtf8(std::string_view bytes);

/// Returns `bytes` as they are, but for each byte that begins no valid UTF-8 sequence: that is
/// replaced by the four characters `\xNN`, its value in hexadecimal.
///
/// Depends on no locale. May be called from any thread. Throws nothing but `std::bad_alloc`.
MZ_COMPONENT_MANAGER_API std::string escapeInvalidUtf8(std::string_view bytes);

} // namespace Mz
