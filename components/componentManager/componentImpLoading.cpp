#include "components/componentManager/componentImpPrivate.h"

#include <cxxabi.h>

namespace Mz {

namespace {

constexpr const char* entryPointName = "QrGetComponentDescription";

const wchar_t* textOf(const wchar_t* text) {
    return text ? text : L"";
}

/// Copies each description that a library offers into a record of the library's.
class AddBuilders final : public QrEnumerator<QrCPtr<QrBuilderDescription>> {
  public:
    AddBuilders(ComponentManager& manager, ComponentLibrary& library)
        : manager(manager), library(library), builders(library.builders) {}

    Action process(QrCPtr<QrBuilderDescription> item) override {
        const auto description =
            QrCPtr<QrBuilderDescription>::adopt(safeCast<QrBuilderDescription>(item.get()));
        ComponentManager::Builder record;
        record.library = &library;
        record.uid = description->getUid();
        record.name = textOf(description->getName());
        record.label = textOf(description->getLabel());
        record.text = textOf(description->getText());
        record.number = description->getNumber();
        record.flag = description->getFlag();
        ComponentManager::Builder& added = builders.emplace_back(record);
        manager.builderIndex[added.uid] = &added;
        return Continue;
    }

  private:
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
    return unchanged || registerLibrary(library, *status);
}

ComponentManager::LoadResult ComponentManager::loadModule(ComponentLibrary& library) {
    const platform::NativePath path = library.openingPath();
    const platform::QuietErrors quiet;
    const platform::UsedLibrary used = platform::useLibrary(path, entryPointName);
    // Only now: initialisers of the library may have asked for one of its builders meanwhile, and
    // found it mapped.
    library.module = used.module;
    library.loadedByManager = used.loaded;
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
        const QrPtr<QrComponentDescription> description = getDescription(library);
        if (description)
            readDescription(library, *description);
        described = static_cast<bool>(description);
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
    const QrPtr<QrCastable> described = library.entryPoint();
    return queryCast<QrComponentDescription>(described.get());
}

QrRefPtr<QrComponentBuilder> ComponentManager::getComponentBuilder(ComponentLibrary& library,
                                                                   const QrUid& uid) {
    if (!ensureLoaded(library, true))
        return nullptr;
    const QrPtr<QrComponentDescription> description = getDescription(library);
    if (!description)
        return nullptr;
    const QrRef<QrCastable> builder = description->createBuilder(uid);
    return queryCast<QrComponentBuilder>(builder.get());
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
