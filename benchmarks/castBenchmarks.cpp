// SPDX-License-Identifier: BSL-1.0
// Casts to an interface, compared with virtual calls and with std::dynamic_pointer_cast.
#include "comparisons.h"
#include "measure.h"
#include "peer.h"

#include <memory>

namespace Mz::Benchmarks {

namespace {

void castUncounted(benchmark::State& state) {
    QrCastable* const object = uncountedGauge();
    repeat(state, [object] {
        const auto gauge = QrPtr<Gauge>::adopt(safeCast<Gauge>(opaque(object)));
        opaque(gauge.get());
    });
}

void threeCalls(benchmark::State& state) {
    Calls* const object = calls();
    repeat(state, [object] {
        Calls* const some = opaque(object);
        some->first();
        some->second();
        some->third();
    });
}

void castToAbsent(benchmark::State& state) {
    QrCastable* const object = uncountedGauge();
    repeat(state, [object] {
        const QrPtr<Absent> none = queryCast<Absent>(opaque(object));
        opaque(none.get());
    });
}

void oneCall(benchmark::State& state) {
    Calls* const object = calls();
    repeat(state, [object] { opaque(object)->first(); });
}

void castCounted(benchmark::State& state) {
    const QrPtr<QrCastable> object(newCountedGauge());
    repeat(state, [&object] {
        const auto gauge = QrPtr<Gauge>::adopt(safeCast<Gauge>(opaque(object.get())));
        opaque(gauge.get());
    });
}

void castSharedPointer(benchmark::State& state) {
    const std::shared_ptr<SharedRoot> object = newSharedGauge();
    repeat(state, [&object] {
        const auto gauge = std::dynamic_pointer_cast<SharedGauge>(*opaque(&object));
        opaque(gauge.get());
    });
}

} // namespace

void addCastComparisons(RatioTable& table) {
    table.add(
        {"cast/uncounted", "safeCast and release, uncounted object", "three virtual calls", 0.8},
        castUncounted, threeCalls);
    table.add({"cast/null", "a cast that answers null", "one virtual call", 1.2}, castToAbsent,
              oneCall);
    table.add({"cast/counted", "safeCast and release, counted object",
               "std::dynamic_pointer_cast with threads", 0.65},
              castCounted, castSharedPointer);
}

} // namespace Mz::Benchmarks
