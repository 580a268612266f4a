#include "components/componentManager/manager/componentImpPrivate.h"

#include <cxxabi.h>
#include <type_traits>
#include <utility>

namespace Mz {

namespace {

constexpr const char* entryPointName = "QrGetComponentDescription";

const wchar_t* textOf(const wchar_t* text) {
    return text ? text : L"";
}

/// A reference on an object of a component library, given back by hand: its `release` may throw,
/// which the destructor of a smart reference answers with `std::terminate`.
template <class T>
class LibraryReference {
  public:
    /// Takes over the reference that `carried` carries.
    explicit LibraryReference(T* carried) : held(carried) {}
    /// Gives back what is left when another exception is on its way, which is the one to report.
    ~LibraryReference() {
        try {
            giveBack();
        } catch (...) { // NOLINT(bugprone-empty-catch)
        }
    }
    LibraryReference(const LibraryReference&) = delete;
    LibraryReference& operator=(const LibraryReference&) = delete;

    T* get() const { return held; }
    [[nodiscard]] T* detach() { return std::exchange(held, nullptr); }

    /// Throws what `release` throws; the reference counts as given back all the same.
    void giveBack() {
        if (T* const object = detach())
            const_cast<std::remove_const_t<T>*>(object)->release();
    }

  private:
    T* held;
};

/// Copies each description that a library offers into a record of the library's.
class AddBuilders final : public QrEnumerator<QrCPtr<QrBuilderDescription>> {
  public:
    AddBuilders(ComponentManager& manager, ComponentLibrary& library)
        : manager(manager), library(library), builders(library.builders) {}

    Action process(QrCPtr<QrBuilderDescription> item) override {
        LibraryReference<const QrBuilderDescription> description(
            safeCast<QrBuilderDescription>(item.get()));
        ComponentManager::Builder& added = builders.emplace_back(recordOf(*description.get()));
        manager.builderIndex[added.uid] = &added;
        description.giveBack();
        return Continue;
    }

  private:
    ComponentManager::Builder recordOf(const QrBuilderDescription& description) const {
        ComponentManager::Builder record;
        record.library = &library;
        record.uid = description.getUid();
        record.name = textOf(description.getName());
        record.label = textOf(description.getLabel());
        record.text = textOf(description.getText());
        record.number = description.getNumber();
        record.flag = description.getFlag();
        return record;
    }

    ComponentManager& manager;
    ComponentLibrary& library;
    ComponentManager::BuilderList& builders;
};

} // namespace

bool ComponentManager::ensureLoaded(ComponentLibrary& library, bool forUse) {
    if (library.module)
        return !library.builders.empty();
    const std::optional<platform::FileStatus> status = platform::queryFile(library.openingPath());
    if (!status) {
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

    // What is no regular file any more must not even be opened: a pipe would keep us waiting.
    const LoadResult result = status->regular ? loadModule(library) : LoadResult::rejected;
    if (result != LoadResult::loaded) {
        dropBuilders(library);
        if (result == LoadResult::rejected)
            library.noteFile(*status); // So that the file is not tried again until it changes.
        else if (unchanged)
            library.noteFile({}); // Or a later start would take it for a file without builders.
        return false;
    }
    // A client may hold a record whose library has changed, and an initialiser of that library may
    // use the client: then the library was registered while it was loaded.
    return unchanged || !library.builders.empty() || registerLibrary(library, *status);
}

ComponentManager::LoadResult ComponentManager::loadModule(ComponentLibrary& library) {
    const platform::NativePath path = library.openingPath();
    const platform::QuietErrors quiet;
    const platform::UsedLibrary used = platform::useLibrary(path, entryPointName);
    if (used.loaded)
        platform::keepOwnLibrary();
    // Only now: initialisers of the library may have asked for one of its builders meanwhile, and
    // found it mapped.
    library.module = used.module;
    library.loadedByManager = used.loaded;
    library.entryPoint = nullptr; // A load that failed may have left an address found meanwhile.
    if (used.module)
        return LoadResult::loaded;
    return used.unknown ? LoadResult::unknown : LoadResult::rejected;
}

/// The exception of a thread's cancellation has no object, which a sanitizer would complain about.
__attribute__((no_sanitize("null"))) bool
ComponentManager::registerLibrary(ComponentLibrary& library, const platform::FileStatus& status) {
    bool described = false;
    bool failed = false;
    try {
        LibraryReference<QrComponentDescription> description(getDescription(library).detach());
        const bool found = description.get() != nullptr;
        if (found)
            readDescription(library, *description.get());
        description.giveBack();
        described = found;
    } catch (abi::__forced_unwind&) {
        // The thread is being cancelled, and this is not the exception of anybody's code. Half a
        // description must not pass for a whole one.
        dropBuilders(library);
        unload(library);
        throw;
    } catch (...) {
        // Nothing more in here: the exception's own code may live in the library, which must not
        // be unloaded before the exception is gone.
        failed = true;
    }
    if (failed)
        dropBuilders(library);
    if (!described)
        unload(library);
    if (!failed)
        library.noteFile(status);
    return described;
}

void ComponentManager::readDescription(ComponentLibrary& library,
                                       QrComponentDescription& description) {
    library.descriptionValue = description.getComponentValue();
    library.componentText2 = textOf(description.getComponentText());
    library.componentText1 = textOf(description.getComponentLabel());
    // The count is the library's word for it and decides nothing: records are added one by one,
    // where they stay.
    static_cast<void>(description.getBuilderCount());
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
    LibraryReference<QrCastable> described(QrPtr<QrCastable>(library.entryPoint()).detach());
    LibraryReference<QrComponentDescription> description(
        queryCast<QrComponentDescription>(described.get()).detach());
    described.giveBack();
    return QrPtr<QrComponentDescription>::adopt(description.detach());
}

QrRefPtr<QrComponentBuilder> ComponentManager::getComponentBuilder(ComponentLibrary& library,
                                                                   const QrUid& uid) {
    if (!ensureLoaded(library, true))
        return nullptr;
    LibraryReference<QrComponentDescription> description(getDescription(library).detach());
    if (!description.get())
        return nullptr;
    LibraryReference<QrCastable> created(description.get()->createBuilder(uid).detach());
    LibraryReference<QrComponentBuilder> builder(
        queryCast<QrComponentBuilder>(created.get()).detach());
    created.giveBack();
    description.giveBack();
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
