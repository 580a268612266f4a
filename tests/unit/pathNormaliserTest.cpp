// SPDX-License-Identifier: BSL-1.0
// Tests the manager's access to the path normaliser. tests/integration/normalisePathTest.cpp tests
// its rules.
#include "components/componentManager/manager/componentImpPrivate.h"

#include <gtest/gtest.h>

namespace {

std::wstring normalised(const wchar_t* path) {
    return Mz::ComponentManager::normalisePath(path, false);
}

TEST(PathNormaliser, WritesRunsOfSeparatorsAsOneBackslashAndLowersCase) {
    EXPECT_EQ(normalised(L"C:/A//b"), L"c:\\a\\b");
    EXPECT_EQ(normalised(L"A\\B\\"), L"a\\b");
}

} // namespace
