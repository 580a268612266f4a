// SPDX-License-Identifier: BSL-1.0
/// Conversions from and to UTF-8, independent of the locale.
///
/// All functions may be called from any thread and throw `std::bad_alloc` only.
///
/// \since 0.2
#pragma once

#include "components/componentManager/export.h"

#include <string>
#include <string_view>

namespace Mz {

/// Returns `text` in UTF-8. Surrogate pairs are joined on every platform. An element that is not a
/// character, such as an unpaired surrogate, becomes U+FFFD.
MZ_COMPONENT_MANAGER_API std::string toUtf8(std::wstring_view text);

/// Returns the UTF-8 text `bytes` as wide text, with surrogate pairs where `wchar_t` has 16 bits.
/// Each byte that begins no valid sequence becomes U+FFFD.
MZ_COMPONENT_MANAGER_API std::wstring fromUtf8(std::string_view bytes);

/// Returns `bytes` with each byte that begins no valid UTF-8 sequence replaced by the four
/// characters `\xNN`, its value in hexadecimal.
MZ_COMPONENT_MANAGER_API std::string escapeInvalidUtf8(std::string_view bytes);

} // namespace Mz
