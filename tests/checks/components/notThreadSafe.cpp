// SPDX-License-Identifier: BSL-1.0
/// Fails when several threads use a builder.
#include "tests/checks/components/broken.h"

#include <atomic>
#include <thread>

class Builder final : public Mz::Test::Building<Builder> {
  public:
    Mz::QrRef<Mz::QrCastable> createObject() override {
        const bool alone = users++ == 0;
        std::this_thread::yield();
        Mz::QrRef<Mz::QrCastable> object = alone ? Building::createObject() : nullptr;
        --users;
        return object;
    }

  private:
    std::atomic<int> users{0};
};

MZ_BROKEN_BUILDER(Builder)
