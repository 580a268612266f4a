// SPDX-License-Identifier: BSL-1.0
/// A component library that does something else where it should offer its builders.
#pragma once

#include "tests/components/testUids.h"

/// Defines the library; `action` is what it does first.
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
