// SPDX-License-Identifier: BSL-1.0
// The look-up of the thread's process controller, compared with one call into a library.
#include "comparisons.h"
#include "measure.h"
#include "peer.h"

#include "components/componentManager/processControl.h"

namespace Mz::Benchmarks {

namespace {

void getController(benchmark::State& state) {
    repeat(state, [] { opaque(QrGetProcessController()); });
}

void getOwnController(benchmark::State& state) {
    // Any controller serves: no function of it is called.
    QrSetThreadProcessController(QrGetSystemProcessController());
    getController(state);
    QrSetThreadProcessController(nullptr);
}

void callLibrary(benchmark::State& state) {
    repeat(state, [] { opaque(trivialCall()); });
}

} // namespace

void addControllerComparisons(RatioTable& table) {
    table.add(
        {"controller/own", "QrGetProcessController, the thread's own", "one library call", 1.1},
        getOwnController, callLibrary);
    table.add({"controller/system", "QrGetProcessController, system-wide", "one library call"},
              getController, callLibrary);
}

} // namespace Mz::Benchmarks
