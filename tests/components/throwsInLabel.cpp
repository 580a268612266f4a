// SPDX-License-Identifier: BSL-1.0
// Throws in getComponentLabel.
#include "tests/components/testUids.h"

#include <stdexcept>

using namespace Mz::Test;

class Description final : public PlainDescription {
  public:
    using PlainDescription::PlainDescription;
    const wchar_t* getComponentLabel() override { throw std::logic_error("in the label"); }
};

MZ_PLAIN_ENTRY_POINT(Description, "label", {{faultyUid, L"faulty"}})
