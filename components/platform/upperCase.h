// SPDX-License-Identifier: BSL-1.0
/// Upper case and sort keys, for the order in which Windows lists the files of a folder.
#pragma once

#include <string>
#include <string_view>

namespace Mz::platform {

/// Returns the upper case of one UTF-16 code unit, or the unit itself if it has none. The mapping
/// is a fixed table and does not depend on the locale.
char16_t upperCase(char16_t unit);

/// Returns the sort key of a file name. Two keys compare, byte by byte, as the UTF-16 code units of
/// the names in upper case do. `name` may be in UTF-16 or UTF-32. The key of a short ASCII name
/// needs no memory: comparing and making keys takes most of the time of a large listing.
std::string sortKey(std::wstring_view name);

} // namespace Mz::platform
