// SPDX-License-Identifier: BSL-1.0
/// Exports something, but not the entry point. Its initialiser must never run; if it does, it
/// leaves the file that the environment names.
#include "components/base/export.h"

#include <cstdlib>
#include <fstream>

static const bool marked = [] {
    if (const char* mark = std::getenv("MZ_TEST_MARK"))
        std::ofstream(mark) << "initialised";
    return true;
}();

extern "C" MZ_EXPORT bool QrGetComponentDescriptions() {
    return marked;
}
