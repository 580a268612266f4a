// SPDX-License-Identifier: BSL-1.0
/// The environment variable that names another recorded list for a host to use.
///
/// \since 0.2
#pragma once

namespace Mz {

/// The name of the variable. Its value is the path of the list; unset or empty, the host uses its
/// own list. `Kit::listFromEnvironment` reads it, and `mzcomponents bisect` sets it.
inline constexpr const char* listVariable = "MZ_COMPONENT_LIST";

} // namespace Mz
