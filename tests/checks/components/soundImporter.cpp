// SPDX-License-Identifier: BSL-1.0
/// Breaks nothing, though it has objects, an import builder and a thread.
#include "tests/checks/components/broken.h"

#include <thread>

class Builder final : public Mz::Test::Importing<Builder> {
  public:
    Builder() : Importing({L"sound", L"SOUND"}) {}
    Mz::QrRef<Mz::QrCastable> createObject() override {
        std::thread([] {}).join();
        return (new Mz::Test::Stored)->getCastable();
    }
};

MZ_BROKEN_BUILDER(Builder)
