#include "tests/unit/locales.h"

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
    return {};
}

} // namespace Mz::Test
