// SPDX-License-Identifier: BSL-1.0
/// Without the kit: a library whose stamp MZ_TEST_CHANGE changes, if it is defined. Apart from that
/// it is sound, so only the stamp can keep a host from loading it.
#include "components/componentKit/stamp.h"
#include "tests/components/testUids.h"

using namespace Mz::Test;

#ifdef MZ_TEST_CHANGE
extern "C" MZ_EXPORT const Mz::ComponentStamp MzComponentStamp;
__attribute__((used)) constexpr Mz::ComponentStamp MzComponentStamp = [] {
    Mz::ComponentStamp stamp MZ_STAMP_VALUE;
    MZ_TEST_CHANGE;
    return stamp;
}();
#else
MZ_COMPONENT_STAMP;
#endif

MZ_PLAIN_ENTRY_POINT(PlainDescription, "stamped", {{goodUid, L"stamped", L"", L"", 0, false}})
