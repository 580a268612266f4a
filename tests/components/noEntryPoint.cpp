// SPDX-License-Identifier: BSL-1.0
/// Exports a function but not the entry point. Its initialiser must not run: it writes the file
/// that the variable MZ_TEST_MARK names.
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
