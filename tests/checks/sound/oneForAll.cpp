// SPDX-License-Identifier: BSL-1.0
/// Its builder returns one object to all clients.
#include "tests/checks/sound/thing.h"

#include <atomic>

using namespace Mz;
using namespace Mz::Test;

namespace {

class Counter final : public QrCastImpl<Counter, Thing> {
  public:
    int value() const override { return ++count; }

  private:
    mutable std::atomic<int> count{0};
};

class CounterBuilder final : public Kit::Builder<CounterBuilder> {
  public:
    static constexpr QrUid builderUid = soundUid(12);

    CounterBuilder() : Builder({.uid = builderUid, .name = L"counter"}) {}
    QrRef<QrCastable> createObject() override {
        static Counter counter;
        return counter.getCastable();
    }
};

} // namespace

MZ_COMPONENT(L"Counter", L"One object for all clients", Kit::builder<CounterBuilder>())
