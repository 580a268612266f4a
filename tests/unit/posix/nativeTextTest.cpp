// SPDX-License-Identifier: BSL-1.0
// Tests names that are bytes, with threads that have their own locale.
#include "components/componentManager/nativeText.h"
#include "components/componentKit/hostKit.h"
#include "tests/unit/locales.h"

#include <gtest/gtest.h>

#include <locale.h>
#include <thread>
#include <unistd.h>

using namespace Mz;
using Mz::Test::LocaleGuard;

#ifdef __SANITIZE_ADDRESS__
// `newlocale` of glibc does not free what it makes of LOCPATH, which other tests set.
extern "C" __attribute__((visibility("default"))) const char* __lsan_default_suppressions() {
    return "leak:__argz_add_sep\n";
}
#endif

namespace {

constexpr const char* utf8Locale = "C.UTF-8";

/// Runs `work` on a thread with that locale.
template <class Work>
void withThreadLocale(const char* name, Work work) {
    std::thread([&] {
        const locale_t locale = ::newlocale(LC_ALL_MASK, name, nullptr);
        ASSERT_TRUE(locale);
        const locale_t before = ::uselocale(locale);
        work();
        ::uselocale(before);
        ::freelocale(locale);
    }).join();
}

TEST(NativeTextOnLinux, FollowsTheThreadAndNotTheProcess) {
    const std::string bytes = "\xC3\xBC \xE6\x97\xA5", each = "\xC3\xBC";
    withThreadLocale(utf8Locale, [&] {
        EXPECT_EQ(toWide(bytes), L"\u00FC \u65E5");
        EXPECT_EQ(Kit::wideText(bytes), L"\u00FC \u65E5");
        EXPECT_EQ(Kit::searchPath("/mz/" + bytes), L"/mz/\u00FC \u65E5");
    });
    const LocaleGuard guard(utf8Locale);
    ASSERT_TRUE(guard);
    withThreadLocale("C", [&] {
        EXPECT_EQ(toWide(each), L"\u00C3\u00BC");
        EXPECT_EQ(Kit::searchPath("/mz/" + each), L"/mz/\u00C3\u00BC");
    });
    EXPECT_EQ(Kit::searchPath("/mz/" + bytes), L"/mz/\u00FC \u65E5");
}

TEST(NativeTextOnLinux, NamesThatAreNoTextHaveNoWideFormAndAreShownAsBytes) {
    const std::filesystem::path name = "caf\xE9.obj";
    EXPECT_EQ(toWideName(name), L"caf\u00E9.obj");
    EXPECT_EQ(utf8Name(name), "caf\\xE9.obj");
    const LocaleGuard guard(utf8Locale);
    ASSERT_TRUE(guard);
    EXPECT_EQ(toWideName(name), std::nullopt);
    EXPECT_EQ(displayName(name), L"caf\\xE9.obj");
    EXPECT_EQ(utf8Name(name), "caf\\xE9.obj");
    EXPECT_EQ(toNativePath(std::wstring(1, static_cast<wchar_t>(0xD800))), std::nullopt);
}

TEST(NativeTextOnLinux, ReasonsAreUtf8WhateverTheLocale) {
    for (const Mz::Test::SingleByteLocale& locale : Mz::Test::singleByteLocales()) {
        const LocaleGuard guard("de_DE.ISO-8859-15");
        ASSERT_TRUE(guard);
        const std::string reason = utf8Name(std::string(1, locale.byte));
        EXPECT_EQ(displayText(reason), std::wstring(1, locale.code));
        EXPECT_EQ(toNarrow(displayText(reason)), std::string(1, locale.byte));
    }
}

TEST(FullPathOnLinux, GoesUpFromWhereALinkLeads) {
    const std::filesystem::path root =
        std::filesystem::canonical(std::filesystem::temp_directory_path()) /
        ("mz-full-path-" + std::to_string(::getpid()));
    std::filesystem::create_directories(root / "a" / "b");
    std::filesystem::create_directory_symlink(root / "a" / "b", root / "link");
    EXPECT_EQ(fullPath(root / "link" / ".." / "c"), root / "a" / "c");
    EXPECT_EQ(fullPath(root / "link" / "c"), root / "link" / "c");
    EXPECT_EQ(Kit::searchPath(root / "link" / ".."), *toWideName(root / "a"));
    std::filesystem::remove_all(root);
}

} // namespace
