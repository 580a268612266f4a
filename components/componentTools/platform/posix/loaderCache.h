/// The loader's own list of the libraries that it knows, and what depends on how we are built.
#pragma once

#include <optional>
#include <string>

namespace Mz::Tools::System {

/// The file that the loader's cache has for the library `name`.
std::optional<std::string> findInLoaderCache(const std::string& name);

/// Whether a limit on private memory leaves the process working: what the sanitizers reserve
/// counts.
#ifdef MZ_UNLIMITED_ADDRESSES
inline constexpr bool dataMayBeLimited = false;
#else
inline constexpr bool dataMayBeLimited = true;
#endif

} // namespace Mz::Tools::System
