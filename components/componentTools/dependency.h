/// A library that another one needs, as plain data.
#pragma once

#include <string>

namespace Mz::Tools {

/// A library that the file needs, directly or indirectly.
struct Dependency {
    std::wstring name;     ///< the name in the file that needs it
    std::wstring neededBy; ///< the file that needs it
    std::wstring path;     ///< its file; empty if it was not found or the system has no file for it
    bool found = false;
};

} // namespace Mz::Tools
