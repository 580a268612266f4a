// SPDX-License-Identifier: BSL-1.0
/// A good library that writes to the standard streams while it is loaded and described.
#include "tests/components/testUids.h"

#include <cstdio>
#include <iostream>

using Mz::Test::PlainDescription;

static int chatter() {
    std::cout << "MZPR this is no answer" << std::endl;
    std::cerr << "MZPR neither is this" << std::endl;
    std::puts("MZPR\1\2\3");
    std::fflush(stdout);
    return 1;
}

static const int value = chatter();

class Description final : public PlainDescription {
  public:
    using PlainDescription::PlainDescription;
    const wchar_t* getComponentLabel() override {
        chatter();
        return PlainDescription::getComponentLabel();
    }
};

MZ_PLAIN_ENTRY_POINT(Description, "chatters",
                     {{Mz::Test::testUid(0x30001), L"chatters", L"", L"",
                       static_cast<unsigned int>(value)}})
