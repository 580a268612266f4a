// SPDX-License-Identifier: BSL-1.0
/// Libraries that need one another, for the rules by which the loader finds them. Each calls the
/// next one, so that the linker keeps the need.
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
