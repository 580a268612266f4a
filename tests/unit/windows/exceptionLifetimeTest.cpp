// SPDX-License-Identifier: BSL-1.0
/// Tests why an exception must not be kept longer than the library that threw it. The runtime keeps
/// the address of the destructor in front of the exception object. On Windows that address is in
/// the thrower, which jumps from there to the library of the class.
#include "components/base/exBase.h"
#include "components/platform/platform.h"
#include "tests/unit/throwsEverything.h"

#include <gtest/gtest.h>
#include <windows.h>

#include <memory>
#include <span>

using namespace Mz;
using namespace Mz::Test;

namespace {

/// Returns the library that contains the address, or null.
HMODULE moduleOf(const void* address) {
    HMODULE module = nullptr;
    GetModuleHandleExW(GET_MODULE_HANDLE_EX_FLAG_FROM_ADDRESS |
                           GET_MODULE_HANDLE_EX_FLAG_UNCHANGED_REFCOUNT,
                       static_cast<const wchar_t*>(address), &module);
    return module;
}

const void* const* wordsOf(const ExBase& exception) {
    return static_cast<const void* const*>(dynamic_cast<const void*>(&exception));
}

TEST(ExceptionLifetime, EndsWithTheLibraryThatThrewUnlikeThatOfAClone) {
    const auto path = platform::toNative(THROWING_LIBRARY);
    ASSERT_TRUE(path);
    const platform::Module library = platform::loadLibrary(*path);
    ASSERT_NE(library, nullptr);
    auto* const raise =
        reinterpret_cast<ThrowFunction*>(platform::findSymbol(library, throwFunctionName));
    ASSERT_NE(raise, nullptr);
    const HMODULE thrower = moduleOf(reinterpret_cast<const void*>(raise));
    ASSERT_NE(thrower, nullptr);
    for (int which = 0; which <= 12; ++which)
        try {
            raise(which);
        } catch (const ExBase& caught) {
            constexpr std::size_t header = 18; // words of the runtime in front of the object
            int inThrower = 0;
            for (const void* word : std::span(wordsOf(caught) - header, header))
                inThrower += moduleOf(word) == thrower;
            EXPECT_EQ(inThrower, 1) << which;
            const std::unique_ptr<ExBase> clone(caught.clone());
            ASSERT_TRUE(clone);
            EXPECT_NE(moduleOf(*wordsOf(*clone)), thrower) << which;
        }
    platform::unloadLibrary(library);
}

} // namespace
