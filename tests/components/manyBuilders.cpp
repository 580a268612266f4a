// SPDX-License-Identifier: BSL-1.0
// Has thousands of builders but states one.
#include "tests/components/testUids.h"

using namespace Mz;
using namespace Mz::Test;

static std::vector<PlainInfo> many() {
    std::vector<PlainInfo> infos;
    for (std::uint32_t index = 0; index < howMany; ++index)
        infos.push_back({testUid(firstOfMany + index), L"many", L"", L"", index});
    return infos;
}

class Description final : public PlainDescription {
  public:
    Description() : PlainDescription("many", many()) {}
    unsigned int getBuilderCount() override { return 1; }
};

MZ_PLAIN_ENTRY_POINT(Description)
