// SPDX-License-Identifier: BSL-1.0
/// The source of libraries that need one another, for tests of the loader's search rules. Each
/// calls a function of the next one, so that the linker keeps the dependency.
#if defined(MZ_TEST_NEXT)
extern "C" __attribute__((visibility("default"))) int MZ_TEST_NEXT();
#endif

extern "C" __attribute__((visibility("default"))) int MZ_TEST_FUNCTION() {
#if defined(MZ_TEST_NEXT)
    return MZ_TEST_NEXT();
#else
    return 1;
#endif
}
