// SPDX-License-Identifier: BSL-1.0
/// The rules of the library as a file that is loaded and unloaded.
#include "components/componentTools/checking/rules.h"

#include "components/componentManager/nativeText.h"
#include "components/componentTools/checking/growth.h"
#include "components/componentTools/images/libraryImage.h"
#include "components/componentTools/platform/resources.h"

#include <chrono>
#include <thread>

namespace Mz::Tools::Rules {

namespace {

/// Describes the library and, if wanted, makes an object of each builder. Returns whether
/// everything could be called.
bool describeOnce(CheckContext& context, QrGetComponentDescriptionFunction* entry, bool objects) {
    DescriptionCollector collector;
    QrPtr<QrCastable> object;
    QrPtr<QrComponentDescription> description;
    bool called = context.attempt(L"the entry point", {}, [&] {
        object = entry();
        description = queryCast<QrComponentDescription>(object.get());
    });
    called = called && description;
    if (called)
        called = context.attempt(L"enumerateBuilders", {},
                                 [&] { description->enumerateBuilders(collector); });
    for (const auto& item : collector.items) {
        QrRef<QrCastable> unused;
        if (!called || !objects)
            break;
        const std::wstring place = placeOf(textOrEmpty(item->getName()), item->getUid());
        called = context.attempt(L"createObject", place, [&] {
            const QrRef<QrCastable> made = description->createBuilder(item->getUid());
            if (const auto builder = queryCast<QrComponentBuilder>(made.get()))
                unused = builder->createObject();
        });
    }
    collector.items.clear();
    const bool released = context.attempt(L"the release of the description", {}, [&] {
        description.reset();
        object.reset();
    });
    // Releasing them ended an earlier process.
    static_cast<void>(description.detach());
    static_cast<void>(object.detach());
    return called && released;
}

/// Loads the library, describes it, and unloads it. Returns whether everything could be called.
bool useOnce(CheckContext& context, bool objects) {
    std::wstring loaderError;
    const platform::Module module = context.load(loaderError);
    QrGetComponentDescriptionFunction* const entry =
        module ? CheckContext::entryPointOf(module) : nullptr;
    const bool called = entry && describeOnce(context, entry, objects);
    context.attempt(L"unloading the library", {}, [&] { platform::unloadLibrary(module); });
    return called;
}

/// Keeps what the library depends on loaded, because only the library itself is checked.
void holdDependencies(CheckContext& context) {
    std::wstring loaderError;
    const platform::Module module = context.load(loaderError);
    System::holdLibraries(readLibraryImage(context.task().file).needed);
    context.attempt(L"unloading the library", {}, [&] { platform::unloadLibrary(module); });
}

bool isLoaded(CheckContext& context) {
    return platform::findLoadedLibrary(context.task().file.native()) != nullptr;
}

std::wstring leftBehind(std::size_t count, std::size_t before, const wchar_t* one,
                        const wchar_t* several) {
    if (count <= before)
        return {};
    const std::size_t more = count - before;
    return std::to_wstring(more) + L" " + (more == 1 ? one : several);
}

} // namespace

void loads(CheckContext& context) {
    std::wstring loaderError;
    const platform::Module module = context.load(loaderError);
    if (!module)
        context.report({}, L"it cannot be loaded: " + loaderError +
                               L". The command `mzcomponents explain` tells more.");
    else
        context.attempt(L"unloading the library", {}, [&] { platform::unloadLibrary(module); });
}

void unloads(CheckContext& context) {
    if (isLoaded(context))
        context.report({}, L"it stays loaded when it is unloaded. Compile it with "
                           L"-fno-gnu-unique and without -z nodelete, and do not load it from "
                           L"itself.");
}

void exports(CheckContext& context) {
    std::wstring names;
    std::size_t count = 0;
    constexpr std::size_t shown = 5;
    for (const std::string& name : exportedNames(context.task().file)) {
        if (isComponentExport(name))
            continue;
        if (++count <= shown)
            names += (names.empty() ? L"" : L", ") + std::wstring(name.begin(), name.end());
    }
    if (count)
        context.report({}, L"it exports " + std::to_wstring(count) +
                               (count == 1 ? L" name" : L" names") + L" besides its entry point: " +
                               names + (count > shown ? L", …" : L"") +
                               L". Compile it with hidden visibility; mz_add_component does.");
}

void reloads(CheckContext& context) {
    holdDependencies(context);
    if (!useOnce(context, false) || isLoaded(context))
        return;
    constexpr int count = 100;
    const std::size_t growth = growthOf([&] { static_cast<void>(useOnce(context, false)); }, count);
    if (!growth)
        return;
    // A description that leaves memory behind at each call is another fault.
    QrGetComponentDescriptionFunction* const entry = context.entryPoint();
    if (!entry)
        return;
    if (growthOf([&] { describeOnce(context, entry, false); }, count) == 0)
        context.report({}, L"each loading and unloading leaves about " + std::to_wstring(growth) +
                               L" bytes behind. Free what static objects and initialisers "
                               L"allocate; MZ_AT_UNLOAD helps.");
}

void leavesNothing(CheckContext& context) {
    holdDependencies(context);
    useOnce(context, true); // What the system loads once is no business of the library.
    const std::size_t threads = System::threadCount(), files = System::openFileCount();
    constexpr int rounds = 3;
    for (int round = 0; round < rounds; ++round)
        useOnce(context, true);
    // Threads that are about to end may.
    for (int wait = 0; wait < 50 && System::threadCount() > threads; ++wait)
        std::this_thread::sleep_for(std::chrono::milliseconds(10));
    const std::wstring moreThreads =
        leftBehind(System::threadCount(), threads, L"thread", L"threads");
    const std::size_t leftFiles = System::openFileCount();
    std::wstring moreFiles;
    if (leftFiles >= files + rounds)
        moreFiles = leftBehind(leftFiles, files, L"open file or handle", L"open files or handles");
    if (!moreThreads.empty() || !moreFiles.empty())
        context.report(
            {}, L"after " + std::to_wstring(rounds) + L" times of use it leaves " + moreThreads +
                    (moreThreads.empty() || moreFiles.empty() ? L"" : L" and ") + moreFiles +
                    L" behind. End and close them when the last object "
                    L"is destroyed, or by MZ_AT_UNLOAD.");
}

} // namespace Mz::Tools::Rules
