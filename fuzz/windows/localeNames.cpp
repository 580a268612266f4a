// SPDX-License-Identifier: BSL-1.0
// Code pages of the C runtime, which knows none with characters of more than two bytes.
#include "fuzz/locales.h"

namespace Mz::Fuzz {

const std::array<std::string, 4>& localeNames() {
    static const std::array<std::string, 4> names{"C", ".936", ".932", "German"};
    return names;
}

} // namespace Mz::Fuzz
