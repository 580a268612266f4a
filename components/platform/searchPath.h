// SPDX-License-Identifier: BSL-1.0
/// Splits search paths: directories, separated by ';' on every system. Empty elements are skipped.
/// A name that contains a ';' cannot be an element.
#pragma once

#include <algorithm>
#include <string_view>

namespace Mz::platform {

/// The separator of search paths, in the character type of the path.
template <class Char>
inline constexpr Char searchPathSeparator = Char(';');

/// Removes the first directory from `rest`, with the separators before it, and returns it as it is
/// spelled. Returns an empty view, and leaves `rest` empty, if there is none.
template <class Char>
std::basic_string_view<Char> takeDirectory(std::basic_string_view<Char>& rest) {
    constexpr Char separator = searchPathSeparator<Char>;
    rest.remove_prefix(std::min(rest.find_first_not_of(separator), rest.size()));
    const std::basic_string_view<Char> directory = rest.substr(0, rest.find(separator));
    rest.remove_prefix(directory.size());
    return directory;
}

} // namespace Mz::platform
