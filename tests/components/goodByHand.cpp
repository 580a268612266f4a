// SPDX-License-Identifier: BSL-1.0
#include "tests/components/testUids.h"

using namespace Mz::Test;

namespace {

/// Tells when the library comes and goes.
struct Presence {
    Presence() { note("goodLoaded"); }
    ~Presence() { note("goodUnloaded"); }
} presence;

} // namespace

/// Compiled without care, this would keep the library mapped for good.
template <class T>
struct MZ_SHARED_TYPE Unique {
    static inline int counter = 0;
};

MZ_PLAIN_ENTRY_POINT(PlainDescription, "good",
                     {{goodUid, L"Name", L"Label", L"Text", 4000000000u, true},
                      {goodSecondUid, L"name", L"", L"\u00E4\u4E2D", 0, false},
                      {goodThirdUid, L"third", L"l", L"t",
                       static_cast<unsigned int>(++Unique<int>::counter), false}})
