// SPDX-License-Identifier: BSL-1.0
/// Tests why an exception must not be kept longer than the library that threw it: on Windows each
/// library has type information of its own.
#include "components/base/exBase.h"
#include "components/platform/platform.h"
#include "tests/unit/throwsEverything.h"

#include <gtest/gtest.h>
#include <windows.h>

#include <memory>
#include <typeinfo>

using namespace Mz;
using namespace Mz::Test;

namespace {

/// Returns the library that contains the address.
HMODULE moduleOf(const void* address) {
    HMODULE module = nullptr;
    EXPECT_TRUE(GetModuleHandleExW(GET_MODULE_HANDLE_EX_FLAG_FROM_ADDRESS |
                                       GET_MODULE_HANDLE_EX_FLAG_UNCHANGED_REFCOUNT,
                                   static_cast<const wchar_t*>(address), &module));
    return module;
}

TEST(ForeignExceptions, HaveTheTypeInformationOfTheirLibrary) {
    const auto path = platform::toNative(THROWING_LIBRARY);
    ASSERT_TRUE(path);
    const platform::Module library = platform::loadLibrary(*path);
    ASSERT_NE(library, nullptr);
    auto* const raise =
        reinterpret_cast<ThrowFunction*>(platform::findSymbol(library, throwFunctionName));
    ASSERT_NE(raise, nullptr);
    int inThrower = 0;
    for (int which = 0; which <= 12; ++which)
        try {
            raise(which);
        } catch (const ExBase& caught) {
            const void* const vtable = *reinterpret_cast<const void* const*>(&caught);
            const bool foreign =
                moduleOf(&typeid(caught)) == moduleOf(reinterpret_cast<const void*>(raise)) ||
                moduleOf(vtable) == moduleOf(reinterpret_cast<const void*>(raise));
            std::fprintf(stderr, "%d %d %d\n", which, moduleOf(&typeid(caught)) == moduleOf(reinterpret_cast<const void*>(raise)),moduleOf(vtable) == moduleOf(reinterpret_cast<const void*>(raise)));
            inThrower += foreign;
        }
    EXPECT_EQ(inThrower, 13);
    platform::unloadLibrary(library);
}

} // namespace
