// SPDX-License-Identifier: BSL-1.0
// Casts to an interface that is not there, in getComponentLabel. The manager throws the same
// exception for a wrong item of the enumeration.
#include "tests/components/testUids.h"

using namespace Mz;
using namespace Mz::Test;

class Description final : public PlainDescription {
  public:
    using PlainDescription::PlainDescription;
    const wchar_t* getComponentLabel() override {
        safeCast<PlainObject>(static_cast<QrCastable*>(this));
        return L"label";
    }
};

MZ_PLAIN_ENTRY_POINT(Description, "label", {{faultyUid, L"faulty"}})
