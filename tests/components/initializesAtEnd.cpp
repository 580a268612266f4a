// SPDX-License-Identifier: BSL-1.0
/// Initialises the manager while it is unloaded.
#include "tests/components/testUids.h"

using namespace Mz;
using namespace Mz::Test;

namespace {

struct AtEnd {
    ~AtEnd() {
        note("ending");
        if (managerUnderTest())
            managerUnderTest()->initialize(searchPathUnderTest());
        note("ended");
    }
} atEnd;

} // namespace

MZ_PLAIN_ENTRY_POINT(PlainDescription, "at end", {{finaliserUid, L"at end"}})
