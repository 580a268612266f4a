// SPDX-License-Identifier: BSL-1.0
// Tests the conversion of names and text between the system and the library.
#include "components/componentManager/nativeText.h"
#include "components/componentManager/utf8.h"
#include "tests/unit/locales.h"

#include <gtest/gtest.h>

using namespace Mz;
using Mz::Test::LocaleGuard;

namespace {

TEST(NativeText, ConvertsBothWaysAsTheLocaleSays) {
    for (const Mz::Test::MultibyteLocale& locale : Mz::Test::multibyteLocales()) {
        const LocaleGuard guard(locale.name);
        const std::wstring text{L'a', locale.code, L'z'};
        EXPECT_EQ(toWide("a" + locale.character + "z"), text) << locale.name;
        EXPECT_EQ(toNarrow(text), "a" + locale.character + "z") << locale.name;
        EXPECT_EQ(toWide(locale.noText), std::nullopt) << locale.name;
        const std::wstring formless{L'a', locale.codeWithoutForm};
        EXPECT_EQ(toNarrow(formless), std::nullopt) << locale.name;
        EXPECT_EQ(toNarrow(formless, '?'), "a?") << locale.name;
    }
}

TEST(NativeText, IsByteByByteInThePlainLocale) {
    EXPECT_EQ(toWide(std::string_view("\xFFz\0", 3)), std::wstring({L'\xFF', L'z', L'\0'}));
    EXPECT_EQ(toNarrow(L"\u00FFz"), "\xFFz");
    EXPECT_EQ(toNarrow(L"\u0100"), std::nullopt);
    EXPECT_EQ(toNarrow(L"\u0100z", '_'), "_z");
}

TEST(NativeText, NamesComeBack) {
    const std::filesystem::path name = u8"w\u00E4 \u65E5";
    const std::optional<std::wstring> wide = toWideName(name);
    ASSERT_TRUE(wide);
    EXPECT_EQ(toNativePath(*wide), name);
    EXPECT_EQ(utf8Name(name), "w\xC3\xA4 \xE6\x97\xA5");
    EXPECT_EQ(displayText(utf8Name(name)), displayName(name));
}

TEST(NativeText, EscapesBytesThatAreNoUtf8) {
    EXPECT_EQ(escapeInvalidUtf8("a\xC3\xA9z"), "a\xC3\xA9z");
    EXPECT_EQ(escapeInvalidUtf8("caf\xE9.obj"), "caf\\xE9.obj");
    EXPECT_EQ(escapeInvalidUtf8("\xE6\x97"), "\\xE6\\x97");
    // Invalid: an overlong form, a surrogate, a code above the last one. Valid: the last code.
    EXPECT_EQ(escapeInvalidUtf8("\xC0\xAF"), "\\xC0\\xAF");
    EXPECT_EQ(escapeInvalidUtf8("\xED\xA0\x80"), "\\xED\\xA0\\x80");
    EXPECT_EQ(escapeInvalidUtf8("\xF4\x90\x80\x80"), "\\xF4\\x90\\x80\\x80");
    EXPECT_EQ(escapeInvalidUtf8("\xF4\x8F\xBF\xBF\xEF\xBF\xBD"), "\xF4\x8F\xBF\xBF\xEF\xBF\xBD");
}

} // namespace
