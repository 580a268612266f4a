// SPDX-License-Identifier: BSL-1.0
#include "fuzz/locales.h"

#include <clocale>

namespace Mz::Fuzz {

void chooseLocale(unsigned int choice) {
    static std::size_t current = 0; // Every process begins in "C".
    const std::size_t wanted = choice % localeNames().size();
    if (wanted == current)
        return;
    if (!std::setlocale(LC_ALL, localeNames()[wanted].c_str()))
        std::setlocale(LC_ALL, "C");
    current = wanted;
}

} // namespace Mz::Fuzz
