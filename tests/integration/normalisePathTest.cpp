// SPDX-License-Identifier: BSL-1.0
/// Tests the normalised form of paths: with known results, and with random paths against a second,
/// simpler implementation.
#include "components/componentManager/manager/componentImpPrivate.h"
#include "components/platform/pathNormaliser.h"

#include <gtest/gtest.h>

#include <random>
#include <string>
#include <vector>

using namespace Mz;

namespace {

std::wstring normalised(const wchar_t* path) {
    return ComponentManager::normalisePath(path, false);
}

std::wstring normalisedList(const wchar_t* path) {
    return ComponentManager::normalisePath(path, true);
}

TEST(NormalisePath, GivesTheKnownResults) {
    EXPECT_EQ(normalised(L"C:/A//b"), L"c:\\a\\b");
    EXPECT_EQ(normalised(L""), L".");
    EXPECT_EQ(normalised(nullptr), L"");
    EXPECT_EQ(normalised(L"..\\x"), L"..\\x");
    EXPECT_EQ(normalised(L"a/./b"), L"a\\\\b");
    EXPECT_EQ(normalised(L"a/b/../c"), L"a\\b\\c");
    EXPECT_EQ(normalised(L"a/b/.."), L"a\\b");
    EXPECT_EQ(normalised(L"A\\B\\"), L"a\\b");
}

TEST(NormalisePath, KeepsRoots) {
    EXPECT_EQ(normalised(L"/"), L"\\");
    EXPECT_EQ(normalised(L"///"), L"\\");
    EXPECT_EQ(normalised(L"/usr//lib/"), L"\\usr\\lib");
    EXPECT_EQ(normalised(L"C:"), L"c:");
    EXPECT_EQ(normalised(L"C:/"), L"c:\\");
    EXPECT_EQ(normalised(L"C:\\\\//"), L"c:\\");
    EXPECT_EQ(normalised(L"C:name"), L"c:name");
    EXPECT_EQ(normalised(L"\\\\Server\\Share\\Dir"), L"\\\\server\\share\\dir");
    EXPECT_EQ(normalised(L"\\\\server\\share"), L"\\\\server\\share");
    EXPECT_EQ(normalised(L"\\\\server\\share\\"), L"\\\\server\\share\\");
    EXPECT_EQ(normalised(L"\\\\server\\share\\\\//x"), L"\\\\server\\share\\x");
    EXPECT_EQ(normalised(L"1:/a"), L"1:\\a"); // Not a drive; an ordinary name.
}

TEST(NormalisePath, TreatsDotsAsTheRulesSay) {
    EXPECT_EQ(normalised(L"."), L".");
    EXPECT_EQ(normalised(L"./"), L".");
    EXPECT_EQ(normalised(L".."), L"..");
    EXPECT_EQ(normalised(L"../"), L"..");
    EXPECT_EQ(normalised(L"../.."), L"..");
    EXPECT_EQ(normalised(L"../../x"), L"..\\x");
    EXPECT_EQ(normalised(L"./plugins"), L"\\plugins");
    EXPECT_EQ(normalised(L"C:/../x"), L"c:\\..\\x");
    EXPECT_EQ(normalised(L"/../x"), L"\\..\\x");
    EXPECT_EQ(normalised(L"a/."), L"a\\");
    EXPECT_EQ(normalised(L"a/./"), L"a\\");
    EXPECT_EQ(normalised(L"a/././b"), L"a\\\\\\b");
    EXPECT_EQ(normalised(L"a/../b"), L"a\\b");
    EXPECT_EQ(normalised(L"..."), L"...");
    EXPECT_EQ(normalised(L"a/.../b"), L"a\\...\\b");
    EXPECT_EQ(normalised(L"a/.b/b./c..d"), L"a\\.b\\b.\\c..d");
    EXPECT_EQ(normalised(L"a/.././b"), L"a\\\\b");
    EXPECT_EQ(normalised(L"a/./../b"), L"a\\\\b");
}

TEST(NormalisePath, LowersLettersAndNothingElse) {
    EXPECT_EQ(normalised(L"ABCXYZ[]^_`{}@"), L"abcxyz[]^_`{}@");
    EXPECT_EQ(normalised(L" Name With Blanks .DLL"), L" name with blanks .dll");
}

TEST(NormalisePath, OutsideOfListModeTakesSemicolonsAsLetters) {
    EXPECT_EQ(normalised(L";"), L";");
    EXPECT_EQ(normalised(L"a;b/../C"), L"a;b\\c");
}

TEST(NormalisePath, InListModeTreatsEachEntryByItself) {
    EXPECT_EQ(normalisedList(nullptr), L"");
    EXPECT_EQ(normalisedList(L""), L".");
    EXPECT_EQ(normalisedList(L";"), L".");
    EXPECT_EQ(normalisedList(L";;;"), L".");
    EXPECT_EQ(normalisedList(L"A"), L"a");
    EXPECT_EQ(normalisedList(L";;A"), L"a");
    EXPECT_EQ(normalisedList(L"A;;"), L"a");
    EXPECT_EQ(normalisedList(L"A;;;B//C;"), L"a;b\\c");
    EXPECT_EQ(normalisedList(L"a/;..\\x;C:/B/"), L"a;..\\x;c:\\b");
    EXPECT_EQ(normalisedList(L"a/b/..;../c"), L"a\\b;..\\c");
    EXPECT_EQ(normalisedList(L"\\\\S\\T\\;/"), L"\\\\s\\t\\;\\");
}

/// A second implementation of the rules that works step by step on names and separators.
class NaiveNormaliser {
  public:
    static std::wstring entry(const std::wstring& path) {
        std::wstring left = path;
        std::wstring out;
        if (left.size() >= 2 && left[0] == L'\\' && left[1] == L'\\') {
            out = L"\\\\";
            left.erase(0, 2);
            moveWhile(left, out, false);
            moveWhile(left, out, true);
            moveWhile(left, out, false);
        } else if (left.size() >= 2 && left[1] == L':' &&
                   std::wstring(L"abcdefghijklmnopqrstuvwxyzABCDEFGHIJKLMNOPQRSTUVWXYZ")
                           .find(left[0]) != std::wstring::npos) {
            out = left.substr(0, 2);
            left.erase(0, 2);
        }
        std::wstring skipped;
        moveWhile(left, skipped, true);
        if (!skipped.empty())
            out += L'\\';
        const std::wstring root = out;
        while (!left.empty()) {
            std::wstring name;
            moveWhile(left, name, false);
            std::wstring run;
            moveWhile(left, run, true);
            if (name == L"..")
                out = out == root ? out + name : out.substr(0, out.size() - 1);
            else if (name != L".")
                out += name;
            if (!run.empty() && !left.empty())
                out += L'\\';
        }
        return out;
    }

    static std::wstring whole(const std::wstring& path, bool listMode) {
        std::wstring out;
        if (!listMode) {
            out = entry(path);
        } else {
            std::vector<std::wstring> entries(1);
            for (const wchar_t c : path)
                if (c == L';')
                    entries.emplace_back();
                else
                    entries.back() += c;
            bool first = true;
            for (const std::wstring& one : entries)
                if (!one.empty()) {
                    out += std::wstring(first ? L"" : L";") + entry(one);
                    first = false;
                }
        }
        if (out.empty())
            out = L".";
        for (wchar_t& c : out)
            if (c >= L'A' && c <= L'Z')
                c = static_cast<wchar_t>(c - L'A' + L'a');
        return out;
    }

  private:
    static void moveWhile(std::wstring& from, std::wstring& to, bool separators) {
        while (!from.empty() && (from[0] == L'/' || from[0] == L'\\') == separators) {
            to += from[0];
            from.erase(0, 1);
        }
    }
};

TEST(NormaliseName, GivesWhatThePathOfThatNameGives) {
    std::mt19937 random(20241105);
    const std::wstring alphabet = L"\\/..:aBcZ~\u00C4";
    int plain = 0;
    for (int round = 0; round < 100000; ++round) {
        std::wstring name;
        for (auto length = random() % 6; length > 0; --length)
            name += alphabet[random() % alphabet.size()];
        ASSERT_EQ(normaliseName(name), normalised(name.c_str())) << name;
        plain += name.size() > 2 && name.find_first_of(L"/\\:") == std::wstring::npos;
    }
    EXPECT_GT(plain, 10000);
}

class RandomPaths : public ::testing::TestWithParam<bool> {};

TEST_P(RandomPaths, GiveWhatANaiveNormaliserGives) {
    std::mt19937 random(20240229);
    const std::wstring alphabet = L"//\\\\..:;;aBcZ~";
    int changed = 0;
    for (int round = 0; round < 100000; ++round) {
        std::wstring path;
        for (auto length = random() % 14; length > 0; --length)
            path += alphabet[random() % alphabet.size()];
        if (random() % 4 == 0)
            path = L"\\\\" + path;
        else if (random() % 4 == 0)
            path = L"C:" + path;
        const std::wstring result = ComponentManager::normalisePath(path.c_str(), GetParam());
        ASSERT_EQ(result, NaiveNormaliser::whole(path, GetParam())) << path;
        changed += result != path;
    }
    EXPECT_GT(changed, 50000);
}

INSTANTIATE_TEST_SUITE_P(NormalisePath, RandomPaths, ::testing::Bool(), [](const auto& parameter) {
    return std::string(parameter.param ? "InListMode" : "OneByOne");
});

} // namespace
