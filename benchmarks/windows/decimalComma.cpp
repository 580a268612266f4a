// SPDX-License-Identifier: BSL-1.0
// The system has all locales.
#include "decimalComma.h"

#include <clocale>

namespace Mz::Benchmarks {

bool setDecimalComma() {
    return std::setlocale(LC_ALL, "German_Germany") && *std::localeconv()->decimal_point == ',';
}

} // namespace Mz::Benchmarks
