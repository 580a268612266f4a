// SPDX-License-Identifier: BSL-1.0
// Throws in getBuilderCount.
#include "tests/components/testUids.h"

#include <new>

using namespace Mz::Test;

class Description final : public PlainDescription {
  public:
    using PlainDescription::PlainDescription;
    unsigned int getBuilderCount() override { throw std::bad_alloc(); }
};

MZ_PLAIN_ENTRY_POINT(Description, "count", {{faultyUid, L"faulty"}})
