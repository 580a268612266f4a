// SPDX-License-Identifier: BSL-1.0
/// A component library that runs other code before it enumerates its builders.
#pragma once

#include "tests/components/testUids.h"

/// Defines the library. The argument is the code that it runs first.
#define MZ_TEST_ENUMERATES(...)                                                                    \
    namespace {                                                                                    \
    using Mz::Test::PlainDescription;                                                              \
    class Description final : public PlainDescription {                                            \
      public:                                                                                      \
        using PlainDescription::PlainDescription;                                                  \
        Mz::QrEnum::Action                                                                         \
        enumerateBuilders(Mz::QrEnumerator<Mz::QrCPtr<Mz::QrBuilderDescription>>& e) override {    \
            __VA_ARGS__;                                                                           \
            return PlainDescription::enumerateBuilders(e);                                         \
        }                                                                                          \
    };                                                                                             \
    }                                                                                              \
    MZ_PLAIN_ENTRY_POINT(Description, "enumerates", {{Mz::Test::faultyUid, L"faulty"}})
