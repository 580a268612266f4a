// SPDX-License-Identifier: BSL-1.0
// Tests how the host kit converts file names for the library.
#include "components/componentKit/hostKit.h"
#include "tests/unit/locales.h"

#include <gtest/gtest.h>

using namespace Mz;
using Mz::Test::LocaleGuard;

namespace {

std::wstring wide(std::string_view bytes) {
    return Kit::wideText(bytes);
}

TEST(HostKit, TakesEachByteForACharacterInThePlainLocale) {
    std::string bytes;
    std::wstring expected;
    for (int byte = 0; byte < 256; ++byte) {
        bytes += static_cast<char>(byte);
        expected += static_cast<wchar_t>(byte);
    }
    EXPECT_EQ(wide(bytes), expected);
    EXPECT_EQ(wide(""), L"");
}

TEST(HostKit, ConvertsAsTheLocaleSays) {
    for (const Mz::Test::MultibyteLocale& locale : Mz::Test::multibyteLocales()) {
        const LocaleGuard guard(locale.name);
        ASSERT_TRUE(guard);
        EXPECT_EQ(wide("a" + locale.character + "z"), std::wstring({L'a', locale.code, L'z'}))
            << locale.name;
        EXPECT_EQ(wide(std::string("a\0z", 3)), std::wstring(L"a\0z", 3));
        EXPECT_THROW(wide("a" + locale.noText + "z"), std::system_error) << locale.name;
        EXPECT_THROW(wide(locale.character.substr(0, 1)), std::system_error) << locale.name;
    }
}

TEST(HostKit, NamesFilesAsTheyAre) {
    EXPECT_EQ(Kit::wideName("some/file.x"), L"some/file.x");
    EXPECT_EQ(Kit::wideText(std::wstring_view(L"w\u00E4\u65E5")), L"w\u00E4\u65E5");
}

TEST(HostKit, SearchesTheFullNameOfAFolder) {
    const std::filesystem::path here = std::filesystem::current_path();
    EXPECT_EQ(Kit::searchPath("plug-ins"), Kit::wideName(here / "plug-ins"));
    EXPECT_EQ(Kit::searchPath("a/./b/../plug-ins"),
              Kit::wideName((here / "a" / "plug-ins").make_preferred()));
    EXPECT_EQ(Kit::searchPath(here), Kit::wideName(here));
}

} // namespace
