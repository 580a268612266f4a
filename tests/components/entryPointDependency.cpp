// SPDX-License-Identifier: BSL-1.0
/// The dependency of `entryPointInDependency`. It exports the entry point, the dependent does not.
#include "tests/components/testUids.h"

MZ_PLAIN_ENTRY_POINT(Mz::Test::PlainDescription, "dependency", {{Mz::Test::faultyUid, L"faulty"}})

extern "C" MZ_EXPORT int dependencyIsNeeded() {
    return 1;
}
