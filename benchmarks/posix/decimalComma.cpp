// SPDX-License-Identifier: BSL-1.0
// Uses a locale that the build has made: a minimal system has only "C".
#include "decimalComma.h"

#include <clocale>
#include <cstdlib>

namespace Mz::Benchmarks {

bool setDecimalComma() {
    ::setenv("LOCPATH", MZ_LOCALE_FOLDER, 1);
    return std::setlocale(LC_ALL, "de_DE.UTF-8") && *std::localeconv()->decimal_point == ',';
}

} // namespace Mz::Benchmarks
