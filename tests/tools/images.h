// SPDX-License-Identifier: BSL-1.0
/// The smallest libraries in either system's format, made byte by byte.
#pragma once

#include <string>

namespace Mz::Test {

struct ImageTraits {
    const char* entryPoint = "QrGetComponentDescription";
    bool function = true; ///< whether that is code
    bool arm = false;
    bool program = false;
};

/// Each exports the entry point, and needs "first.lib" and "second.lib".
std::string elfLibrary(const ImageTraits& traits);
std::string peLibrary(const ImageTraits& traits);

} // namespace Mz::Test
