// SPDX-License-Identifier: BSL-1.0
// The UTF-8 locale of the system, and a single-byte locale that the build makes.
#include "tests/unit/locales.h"

#include <cstdlib>

namespace Mz::Test {

std::vector<MultibyteLocale> multibyteLocales() {
    std::vector<MultibyteLocale> known;
    const MultibyteLocale utf8[] = {
        {"C.UTF-8", "\xC3\xA9", L'\u00E9', "\xFF\xFF\xFF\xFF", static_cast<wchar_t>(0xD800)},
        {"C.UTF-8", "\xE2\x82\xAC", L'\u20AC', "\xC3\x28zz", static_cast<wchar_t>(0xDBFF)},
        {"C.UTF-8", "\xF0\x9F\x98\x80", static_cast<wchar_t>(0x1F600), "\xF0\x9F\x98\x28",
         static_cast<wchar_t>(0xDFFF)},
    };
    for (const MultibyteLocale& locale : utf8)
        if (LocaleGuard(locale.name))
            known.push_back(locale);
    return known;
}

std::vector<SingleByteLocale> singleByteLocales() {
    // Few systems install a single-byte locale. The build makes one if it finds the tools.
    setenv("LOCPATH", MZ_LOCALE_FOLDER, 1);
    constexpr const char* name = "de_DE.ISO-8859-15";
    if (!LocaleGuard(name))
        return {};
    return {{name, '\xA4', L'\u20AC'}, {name, '\xE4', L'\u00E4'}, {name, 'a', L'a'}};
}

} // namespace Mz::Test
