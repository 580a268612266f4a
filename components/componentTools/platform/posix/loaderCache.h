/// The loader's own list of the libraries that it knows, and what depends on how we are built.
#pragma once

#include <optional>
#include <string>

namespace Mz::Tools::System {

/// The file that the loader's cache has for the library `name`.
std::optional<std::string> findInLoaderCache(const std::string& name);

/// Whether a limit on addresses leaves the process working: the sanitizers need nearly all there
/// are.
#ifdef MZ_UNLIMITED_ADDRESSES
inline constexpr bool addressSpaceMayBeLimited = false;
#else
inline constexpr bool addressSpaceMayBeLimited = true;
#endif

} // namespace Mz::Tools::System
