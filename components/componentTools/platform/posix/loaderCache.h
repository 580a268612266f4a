// SPDX-License-Identifier: BSL-1.0
/// Looks libraries up in the loader's cache; also a constant that depends on the build.
#pragma once

#include <optional>
#include <string>

namespace Mz::Tools::System {

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
