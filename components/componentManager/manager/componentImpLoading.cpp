// SPDX-License-Identifier: BSL-1.0
/// Loads one component library, and records what it describes.
///
/// A library is loaded only if its file is new or has changed, or if a client asks for one of its
/// builders. All code of the library may throw, even `release`, and the code and type of an
/// exception may be in the library itself. Therefore each reference is released explicitly, and a
/// library is unloaded only after the exception is destroyed.
#include "components/componentManager/manager/componentImpPrivate.h"
#include "components/componentManager/recordFormat.h"
#include "components/componentManager/support/alwaysInline.h"

#include <cxxabi.h>
#include <list>
#include <optional>
#include <type_traits>
#include <utility>

namespace Mz {

namespace {

constexpr const char* entryPointName = "QrGetComponentDescription";

/// A reference to an object of a component library, which is released explicitly. The object's
/// `release` may throw; in the destructor of a smart reference that calls `std::terminate`.
template <class T>
class LibraryReference {
  public:
    /// Adopts the reference of `adopted`, which may be null.
    explicit LibraryReference(T* adopted) : object(adopted) {}
    /// Releases the reference if another exception skipped `release`. Only that one propagates.
    ~LibraryReference() {
        try {
            release();
        } catch (...) { // NOLINT(bugprone-empty-catch)
        }
    }
    LibraryReference(const LibraryReference&) = delete;
    LibraryReference& operator=(const LibraryReference&) = delete;

    T* get() const { return object; }
    [[nodiscard]] T* detach() { return std::exchange(object, nullptr); }

    /// Releases the reference, once: if the object's `release` throws, it is not called again.
    void release() {
        if (T* const released = detach())
            const_cast<std::remove_const_t<T>*>(released)->release();
    }

  private:
    T* object;
};

/// Copies each builder description into a record of the library, and registers it.
class AddBuilders final : public QrEnumerator<QrCPtr<QrBuilderDescription>> {
  public:
    AddBuilders(ComponentManager& manager, ComponentLibrary& library)
        : manager(manager), library(library), builders(library.builders) {}

    Action process(QrCPtr<QrBuilderDescription> item) override {
        LibraryReference<const QrBuilderDescription> description(
            safeCast<QrBuilderDescription>(item.get()));
        ComponentManager::Builder& added = builders.emplace_back(recordOf(*description.get()));
        manager.builderIndex[added.uid] = &added;
        description.release();
        return Continue;
    }

  private:
    ComponentManager::Builder recordOf(const QrBuilderDescription& description) const {
        ComponentManager::Builder record;
        record.library = &library;
        detail::copyDescription(description, record);
        return record;
    }

    ComponentManager& manager;
    ComponentLibrary& library;
    ComponentManager::BuilderList& builders;
};

/// Calls the entry point of a library, and returns a new reference to its description, or null.
MZ_ALWAYS_INLINE inline QrComponentDescription*
describedBy(QrGetComponentDescriptionFunction* entryPoint) {
    LibraryReference<QrCastable> described(QrPtr<QrCastable>(entryPoint()).detach());
    LibraryReference<QrComponentDescription> description(
        queryCast<QrComponentDescription>(described.get()).detach());
    described.release();
    return description.detach();
}

} // namespace

bool ComponentManager::loadIfNeeded(ComponentLibrary& library, bool forUse) {
    bool unknown = false;
    const std::optional<platform::FileStatus> status =
        platform::queryFile(library.openingPath(), &unknown);
    if (!status) {
        // A later start must not take the file for one without builders. Its name on this system is
        // not known if its folder could not be listed.
        if ((unknown || library.foundPath.empty()) && !library.builders.empty())
            library.noteFile({});
        dropBuilders(library);
        return false;
    }
    const bool unchanged = status->time == library.fileTime && status->size == library.fileSize;
    if (!unchanged)
        dropBuilders(library);
    else if (!forUse)
        reindexBuilders(library);
    if (unchanged && (!forUse || library.builders.empty()))
        return !library.builders.empty();

    // Never open what is no longer a regular file: opening a pipe could block.
    const LoadResult result = status->regular ? loadModule(library) : LoadResult::rejected;
    if (result != LoadResult::loaded) {
        dropBuilders(library);
        if (result == LoadResult::rejected)
            library.noteFile(*status); // The file is not tried again until it changes.
        else if (unchanged) // A later start must not take the file for one without builders.
            library.noteFile({});
        return false;
    }
    // If the library has changed, one of its initialisers may have used a builder record that a
    // client holds. Then that nested call has registered the library already.
    return unchanged || !library.builders.empty() || registerLibrary(library, *status);
}

ComponentManager::LoadResult ComponentManager::loadModule(ComponentLibrary& library) {
    const platform::NativePath path = library.openingPath();
    const platform::QuietErrors quiet;
    const platform::UsedLibrary used = platform::useLibrary(path, entryPointName);
    if (used.loaded)
        platform::pinThisLibrary();
    // Set these after the load: initialisers of the library may have asked for one of its builders.
    // Such a nested call found the library mapped and set them, too.
    library.module = used.module;
    library.loadedByManager = used.loaded;
    library.entryPoint = nullptr; // A nested call may have set it before the load failed.
    if (used.module)
        return LoadResult::loaded;
    return used.unknown ? LoadResult::unknown : LoadResult::rejected;
}

/// Not sanitized for null: the exception of a thread's cancellation has no object, and binding the
/// reference to it would be reported.
__attribute__((no_sanitize("null"))) bool
ComponentManager::registerLibrary(ComponentLibrary& library, const platform::FileStatus& status) {
    bool described = false;
    bool failed = false;
    // For the builders of a failure, which may be a failed allocation. There are none without it.
    std::list<BuilderList> place;
    try {
        place.emplace_back(builderPool);
        LibraryReference<QrComponentDescription> description(getDescription(library).detach());
        const bool found = description.get() != nullptr;
        if (found)
            readDescription(library, *description.get());
        description.release();
        described = found;
    } catch (abi::__forced_unwind&) {
        // The thread is being cancelled, and this exception must propagate. An incomplete
        // description must not stay registered.
        dropBuilders(library, place);
        unload(library);
        throw;
    } catch (...) {
        // Unload the library only after this handler: it may contain the code that destroys the
        // exception.
        failed = true;
    }
    if (failed)
        dropBuilders(library, place);
    if (!described)
        unload(library);
    if (!failed)
        library.noteFile(status);
    return described;
}

void ComponentManager::readDescription(ComponentLibrary& library,
                                       QrComponentDescription& description) {
    // The announced count may be wrong, so nothing is reserved. Records are allocated one by one
    // and never move.
    static_cast<void>(detail::copyDescription(description, library.descriptionValue,
                                              library.componentText2, library.componentText1));
    AddBuilders adder(*this, library);
    description.enumerateBuilders(adder);
}

QrPtr<QrComponentDescription> ComponentManager::getDescription(ComponentLibrary& library) {
    if (!library.module)
        ensureLoaded(library, false);
    if (!library.entryPoint)
        library.entryPoint = reinterpret_cast<QrGetComponentDescriptionFunction*>(
            platform::findSymbol(library.module, entryPointName));
    if (!library.entryPoint) {
        unload(library);
        return nullptr;
    }
    return QrPtr<QrComponentDescription>::adopt(describedBy(library.entryPoint));
}

QrRefPtr<QrComponentBuilder> ComponentManager::getComponentBuilder(ComponentLibrary& library,
                                                                   const QrUid& uid) {
    if (!ensureLoaded(library, true))
        return nullptr;
    LibraryReference<QrComponentDescription> description(
        library.entryPoint ? describedBy(library.entryPoint) : getDescription(library).detach());
    if (!description.get())
        return nullptr;
    LibraryReference<QrCastable> created(description.get()->createBuilder(uid).detach());
    LibraryReference<QrComponentBuilder> builder(
        queryCast<QrComponentBuilder>(created.get()).detach());
    created.release();
    description.release();
    return QrRefPtr<QrComponentBuilder>::adopt(builder.detach());
}

void ComponentManager::unload(ComponentLibrary& library) {
    if (!library.loadedByManager)
        return;
    platform::unloadLibrary(library.module);
    library.module = nullptr;
    library.entryPoint = nullptr;
    library.loadedByManager = false;
}

} // namespace Mz
