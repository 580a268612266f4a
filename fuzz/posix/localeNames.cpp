// SPDX-License-Identifier: BSL-1.0
// Locales of the system, and of those that the build makes.
#include "fuzz/locales.h"

#include <cstdlib>

namespace Mz::Fuzz {

const std::array<std::string, 4>& localeNames() {
    static const std::array<std::string, 4> names = [] {
        setenv("LOCPATH", MZ_LOCALE_FOLDER, 1);
        return std::array<std::string, 4>{"C", "C.UTF-8", "ja_JP.SHIFT_JIS", "de_DE.UTF-8"};
    }();
    return names;
}

} // namespace Mz::Fuzz
