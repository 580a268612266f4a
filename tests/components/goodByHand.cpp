// SPDX-License-Identifier: BSL-1.0
// A component library without faults, written without the kit.
#include "tests/components/testUids.h"

using namespace Mz::Test;

namespace {

/// Reports when the library is loaded and unloaded.
struct Presence {
    Presence() { note("goodLoaded"); }
    ~Presence() { note("goodUnloaded"); }
} presence;

} // namespace

/// Without -fno-gnu-unique this static member is a unique symbol, which keeps the library mapped
/// for ever on Linux.
template <class T>
struct MZ_SHARED_TYPE Unique {
    static inline int counter = 0;
};

MZ_PLAIN_ENTRY_POINT(PlainDescription, "good",
                     {{goodUid, L"Name", L"Label", L"Text", 4000000000u, true},
                      {goodSecondUid, L"name", L"", L"\u00E4\u4E2D", 0, false},
                      {goodThirdUid, L"third", L"l", L"t",
                       static_cast<unsigned int>(++Unique<int>::counter), false}})
