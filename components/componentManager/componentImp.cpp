// SPDX-License-Identifier: BSL-1.0
/// The interfaces, and the manager's operations.
///
/// The destructors and the empty private functions are defined here, so that each interface's
/// vtable and type information exist once, in this library. The manager is a static object without
/// a lock. Its constructor loads nothing; only `initialize` does.
#include "components/componentManager/manager/componentImpPrivate.h"

#include <cstddef>
#include <list>
#include <string>
#include <vector>

namespace Mz {

QrComponentBuilder::~QrComponentBuilder() = default;

QrRefPtr<QrComponentBuilder> QrComponentBuilder::getBuilder() {
    return this;
}

QrBuilderDescription::~QrBuilderDescription() = default;

void QrBuilderDescription::forceVtblInstantiation() {}

QrComponentDescription::~QrComponentDescription() = default;

void QrComponentDescription::forceVtblInstantiation() {}

QrComponentManager::~QrComponentManager() = default;

ComponentManager::ComponentManager() = default;

ComponentManager::~ComponentManager() {
    // To libraries that call the manager while they are unloaded, it looks uninitialised.
    initialised = false;
    initialising = true; // Never reset, so that such a call cannot initialise it again.
    builderIndex.clear();
    while (!libraries.empty())
        libraries.pop_back();
}

QrRefPtr<QrComponentBuilder> ComponentManager::getBuilder(const QrUid& uid) {
    if (!initialised)
        return nullptr;
    Builder* const* found = builderIndex.find(uid);
    if (!found)
        return nullptr;
    const Builder& builder = **found;
    return getComponentBuilder(*builder.library, builder.uid);
}

QrEnum::Action ComponentManager::enumerateBuilders(QrEnumerator<QrCPtr<QrBuilderDescription>>& e) {
    if (!initialised)
        return e.finished();
    for (ComponentLibrary& library : libraries) {
        // By index: the callee may use a builder whose library has changed. That replaces the
        // records during this walk.
        for (std::size_t index = 0; index < library.builders.size(); ++index) {
            const QrEnum::Action action = e.process(&library.builders[index]);
            if (action != QrEnum::Continue)
                return action;
        }
    }
    return e.finished();
}

namespace {

std::size_t builderCount(const ComponentManager::LibraryList& libraries) {
    std::size_t count = 0;
    for (const ComponentLibrary& library : libraries)
        count += library.builders.size();
    return count;
}

} // namespace

void ComponentManager::initialize(const wchar_t* searchPath) {
    if (initialised || initialising)
        return;
    struct Initialising {
        bool& flag;
        explicit Initialising(bool& value) : flag(value) { flag = true; }
        ~Initialising() { flag = false; }
    } const guard(initialising);
    // An exception may end this call anywhere, and another call may follow. Therefore the restored
    // records stay in `libraries` until discovery is complete, and the index never refers to a
    // destroyed record.
    {
        LibraryList found;
        LibraryMap byName;
        std::vector<std::wstring> unlisted;
        discover(searchPath, found, byName, unlisted);
        merge(found, byName);
        keepUnlisted(found, unlisted);
        libraries.swap(found);
        builderIndex.clear(); // Before the records without a file, in `found`, are destroyed.
    }
    builderIndex.reserve(builderCount(libraries));
    for (ComponentLibrary& library : libraries)
        if (library.module)
            reindexBuilders(library); // Loaded by an earlier call that threw.
        else
            ensureLoaded(library, false);
    initialised = true;
}

QrRef<QrCastable> ComponentManager::createObject(const QrUid& uid) {
    if (!initialised)
        return nullptr;
    const QrRefPtr<QrComponentBuilder> found = getBuilder(uid);
    const QrPtr<QrComponentBuilder> builder = queryCast<QrComponentBuilder>(found.get());
    return builder ? builder->createObject() : nullptr;
}

ComponentLibrary::ComponentLibrary(ComponentManager& manager)
    : builders(manager.builderPool), manager(&manager) {}

ComponentLibrary::~ComponentLibrary() {
    if (loadedByManager)
        platform::unloadLibrary(module);
}

platform::NativePath ComponentLibrary::openingPath() const {
    return platform::openingPath(directory, fileName, foundPath);
}

void ComponentLibrary::noteFile(const platform::FileStatus& status) {
    fileTime = status.time;
    fileSize = status.size;
}

namespace {

ComponentManager manager;

} // namespace

} // namespace Mz

Mz::QrComponentManager* QrGetComponentManager() {
    return &Mz::manager;
}
