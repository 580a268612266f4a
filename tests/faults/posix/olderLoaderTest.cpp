// SPDX-License-Identifier: BSL-1.0
/// Tests the component manager with a C library that does not tell the program headers of a loaded
/// library: the function of the library whose symbol was found is determined by a search then.
#include "tests/faults/managerFaultFixture.h"

#include <cerrno>
#include <dlfcn.h>

namespace {

/// RTLD_DI_PHDR of newer C libraries.
constexpr int programHeaders = 11;
bool isOlder = false;
int refused = 0;

} // namespace

/// Takes precedence over that of the C library.
extern "C" __attribute__((visibility("default"))) int dlinfo(void* module, int request,
                                                             void* result) noexcept {
    static auto* const next =
        reinterpret_cast<int (*)(void*, int, void*)>(::dlsym(RTLD_NEXT, "dlinfo"));
    if (isOlder && request == programHeaders) {
        ++refused;
        return -1;
    }
    return next(module, request, result);
}

namespace Mz::Test {

namespace {

using ManagerWithOlderLoader = ManagerFaultTest;

TEST_F(ManagerWithOlderLoader, FindsTheSame) {
    add(L"dataEntryPoint");
    initialize();
    EXPECT_EQ(names(), all);
    const std::string recorded = list();
    restart();
    isOlder = true;
    initialize();
    isOlder = false;
    EXPECT_GE(refused, 2);
    EXPECT_EQ(names(), all);
    EXPECT_EQ(list(), recorded);
    EXPECT_TRUE(manager->createObject(recordedGamma));
}

} // namespace

} // namespace Mz::Test
