// SPDX-License-Identifier: BSL-1.0
/// Upper case and sort keys, for the order in which Windows lists the files of a folder.
#pragma once

#include <string>
#include <string_view>

namespace Mz::platform {

/// Returns the upper case of one UTF-16 code unit, or the unit itself if it has none. The mapping
/// is a fixed table and does not depend on the locale.
char16_t upperCase(char16_t unit);

/// Returns the sort key of a file name: its UTF-16 code units, each in upper case. Keys are
/// compared by code unit. `name` may be in UTF-16 or UTF-32.
std::u16string sortKey(std::wstring_view name);

} // namespace Mz::platform
