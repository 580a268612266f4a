/// The order in which Windows lists the files of a folder.
#pragma once

#include <string>
#include <string_view>

namespace Mz::platform {

/// Returns the upper case of one UTF-16 code unit by a fixed table, whatever the locale; the unit
/// itself if it has none.
char16_t upperCase(char16_t unit);

/// Returns `name` as it is compared to sort the files of a folder: in UTF-16 code units, each in
/// upper case. `name` has one character in each element, or is UTF-16 already.
std::u16string sortKey(std::wstring_view name);

} // namespace Mz::platform
