// SPDX-License-Identifier: BSL-1.0
/// A library that another one needs, as plain data.
///
/// \since 0.2
#pragma once

#include <string>

namespace Mz::Tools {

/// A library that a file needs, directly or indirectly.
struct Dependency {
    std::wstring name;     ///< the name in the file that needs it
    std::wstring neededBy; ///< the file that needs it
    std::wstring path;     ///< its file, if it was found and has one; valid only if `found`
    bool found = false;    ///< whether the loader would find it
};

} // namespace Mz::Tools
