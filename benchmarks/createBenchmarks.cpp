// SPDX-License-Identifier: BSL-1.0
// Making objects through the manager, compared with the calls that a component can see, and through
// a kept builder, compared with a virtual factory function.
#include "byHand.h"
#include "comparisons.h"
#include "manager.h"
#include "measure.h"
#include "peer.h"

#include "generated/identity.h"

#include <algorithm>
#include <filesystem>
#include <memory>
#include <unordered_map>

namespace Mz::Benchmarks {

namespace {

/// A builder in the middle of those that the manager knows.
constexpr QrUid measuredUid = generatedUid(builderCount / 2);

void createObject(benchmark::State& state) {
    QrComponentManager* const manager = initializedManager();
    const QrUid uid = measuredUid;
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

struct UidHash {
    std::size_t operator()(const QrUid& uid) const { return uid.w0; }
};

using EntryPoints = std::unordered_map<QrUid, QrGetComponentDescriptionFunction*, UidHash>;

/// Returns the entry points of the generated libraries by the uids of their builders.
EntryPoints loadedByHand() {
    EntryPoints found;
    for (const auto& entry : std::filesystem::directory_iterator(generatedFolder())) {
        void* const library = openLibrary(entry.path());
        void* const uid = library ? functionOf(library, "mzBenchmarkUid") : nullptr;
        void* const entryPoint =
            library ? functionOf(library, "QrGetComponentDescription") : nullptr;
        if (uid && entryPoint)
            found[*reinterpret_cast<const QrUid* (*)()>(uid)()] =
                reinterpret_cast<QrGetComponentDescriptionFunction*>(entryPoint);
    }
    return found;
}

/// Makes an object with the calls that a component can observe at the manager's `createObject`, and
/// none beside: the manager casts the builder twice, in its `getBuilder` and for its own use.
QrRef<QrCastable> createByHand(const EntryPoints& entryPoints, const QrUid& uid) {
    const auto found = entryPoints.find(uid);
    if (found == entryPoints.end())
        return nullptr;
    const QrPtr<QrCastable> described(found->second());
    const QrPtr<QrComponentDescription> description =
        queryCast<QrComponentDescription>(described.get());
    const QrRef<QrCastable> created = description->createBuilder(uid);
    const QrPtr<QrComponentBuilder> gotten = queryCast<QrComponentBuilder>(created.get());
    const QrPtr<QrComponentBuilder> builder = queryCast<QrComponentBuilder>(gotten.get());
    return builder->createObject();
}

void createObjectByHand(benchmark::State& state) {
    initializedManager(); // Each side with the same libraries loaded.
    static const EntryPoints entryPoints = loadedByHand();
    const QrUid uid = measuredUid;
    if (entryPoints.size() != builderCount || !createByHand(entryPoints, uid)) {
        state.SkipWithError("the generated libraries cannot be used by hand");
        return;
    }
    repeat(state, [&uid] {
        const QrRef<QrCastable> object = createByHand(*opaque(&entryPoints), uid);
        opaque(object.get());
    });
}

void createByKeptBuilder(benchmark::State& state) {
    const QrRefPtr<QrComponentBuilder> builder = initializedManager()->getBuilder(measuredUid);
    if (!builder) {
        state.SkipWithError("the generated builder is not known");
        return;
    }
    repeat(state, [&builder] {
        const QrRef<QrCastable> object = opaque(builder.get())->createObject();
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
               "the calls that components see, one look-up", 1.25},
              createObject, createObjectByHand);
    table.add({"create/kept", "createObject of a kept builder, and release",
               "virtual factory call, new and delete", 1.8},
              createByKeptBuilder, callFactory);
}

} // namespace Mz::Benchmarks
