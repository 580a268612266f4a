// SPDX-License-Identifier: BSL-1.0
/// Looks libraries up in the loader's cache; also a constant that depends on the build.
#pragma once

#include <optional>
#include <string>
#include <unordered_map>

namespace Mz::Tools::System {

/// The files of libraries by their names.
using LoaderCache = std::unordered_map<std::string, std::string>;

/// Returns the libraries for x86-64 in the content of a cache. Ignores what is cut off.
LoaderCache librariesInLoaderCache(const std::string& content);

/// Returns the file of the library `name` in the loader's cache; `std::nullopt` if it has none.
std::optional<std::string> findInLoaderCache(const std::string& name);

/// Whether `RLIMIT_DATA` can be used. Under the sanitizers it cannot: it counts the addresses that
/// they reserve.
#ifdef MZ_UNLIMITED_ADDRESSES
inline constexpr bool dataMayBeLimited = false;
#else
inline constexpr bool dataMayBeLimited = true;
#endif

} // namespace Mz::Tools::System
