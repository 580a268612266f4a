// SPDX-License-Identifier: BSL-1.0
// The double-byte and single-byte code pages that the C runtime may have.
#include "tests/unit/locales.h"

namespace Mz::Test {

std::vector<MultibyteLocale> multibyteLocales() {
    std::vector<MultibyteLocale> known;
    constexpr auto surrogate = static_cast<wchar_t>(0xD800);
    const MultibyteLocale doubleByte[] = {
        {".932", "\x83\x41", L'\u30A2', "\xFF\xFF\xFF\xFF", surrogate},
        {".936", "\xB0\xA1", L'\u554A', "\xFF\xFF\xFF\xFF", surrogate},
        {".949", "\xB0\xA1", L'\uAC00', "\xFF\xFF\xFF\xFF", surrogate},
        {".950", "\xC3\xA9", L'\u77C7', "\xFF\xFF\xFF\xFF", surrogate},
    };
    for (const MultibyteLocale& locale : doubleByte)
        if (LocaleGuard(locale.name))
            known.push_back(locale);
    return known;
}

std::vector<SingleByteLocale> singleByteLocales() {
    std::vector<SingleByteLocale> known;
    for (const SingleByteLocale& locale : {SingleByteLocale{".1252", '\x80', L'\u20AC'},
                                           SingleByteLocale{".1251", '\xFF', L'\u044F'}})
        if (LocaleGuard(locale.name))
            known.push_back(locale);
    return known;
}

} // namespace Mz::Test
