// SPDX-License-Identifier: BSL-1.0
// createObject through the manager, compared with a virtual factory function.
#include "comparisons.h"
#include "libraryFolder.h"
#include "measure.h"
#include "peer.h"

#include "generated/identity.h"

#include "components/componentManager/componentImp.h"

#include <memory>

namespace Mz::Benchmarks {

namespace {

constexpr unsigned int builderCount = 1000;

/// Returns the process-wide manager, initialised with `builderCount` builders in as many libraries.
QrComponentManager* initializedManager() {
    static const LibraryFolder folder(MZ_BENCHMARK_COMPONENT, builderCount);
    QrComponentManager* const manager = QrGetComponentManager();
    manager->initialize(folder.path().wstring().c_str());
    return manager;
}

void createObject(benchmark::State& state) {
    QrComponentManager* const manager = initializedManager();
    const QrUid uid = generatedUid(builderCount / 2);
    const QrUid last = generatedUid(builderCount - 1);
    if (!manager->createObject(uid) || !manager->createObject(last)) {
        state.SkipWithError("the generated builders are not known");
        return;
    }
    repeat(state, [manager, &uid] {
        const QrRef<QrCastable> object = opaque(manager)->createObject(uid);
        opaque(object.get());
    });
}

void callFactory(benchmark::State& state) {
    Factory* const maker = factory();
    repeat(state, [maker] {
        const std::unique_ptr<Product> product(opaque(maker)->make());
        opaque(product.get());
    });
}

} // namespace

void addCreateComparisons(RatioTable& table) {
    table.add({"create/object", "createObject and release, 1,000 builders known",
               "virtual factory call, new and delete", 3.6},
              createObject, callFactory);
}

} // namespace Mz::Benchmarks
