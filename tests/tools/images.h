// SPDX-License-Identifier: BSL-1.0
/// Makes minimal libraries in ELF and PE format.
#pragma once

#include <string>

namespace Mz::Test {

struct ImageTraits {
    const char* entryPoint = "QrGetComponentDescription";
    bool function = true; ///< whether the entry point is a function
    bool arm = false;
    bool program = false;
};

/// Each returns a library that exports the entry point and needs "first.lib" and "second.lib".
std::string elfLibrary(const ImageTraits& traits);
std::string peLibrary(const ImageTraits& traits);

} // namespace Mz::Test
