// SPDX-License-Identifier: BSL-1.0
/// A host program that loads and unloads the component manager at run time.
///
///     loadingHost LIBRARY FUNCTION MODE PATH...
///
/// LIBRARY is libMZcomponentManager or a plug-in that uses it. FUNCTION is its function that
/// returns the manager. At the end the program prints for each PATH whether that file is mapped.
///
///     cycles      300 times: loads, initialises with a folder that does not exist, unloads
///     growth      1,000 times the same, with entries in the registries; prints whether memory or
///     handles grew threads     loads and unloads on four threads at once, 75 cycles each component
///     300 times: loads, initialises with the folder of the first PATH, creates an
///                 object, unloads
///     thread      the same once, on a thread that ends before the library is unloaded
///     copy        the same once; then a forked copy of the process ends before the process
#include "tests/components/testUids.h"
#include "tests/support/testSystem.h"

#include <cstdio>
#include <cstdlib>
#include <string>
#include <string_view>
#include <thread>
#include <vector>

using namespace Mz;
using namespace Mz::Test;

namespace {

using GetManager = QrComponentManager*();
using AddTranslation = void(QrCastable*, QrCastable*, bool (*)(const QrUid&));
using SetController = void(void*);
using GetController = void*();

std::filesystem::path library;
const char* function = "";
std::wstring nowhere;

void* load() {
    void* const module = loadAsHost(library);
    if (!module) {
        std::puts("cannot load");
        std::exit(1);
    }
    return module;
}

template <class Function>
Function* find(void* module, const char* name) {
    return reinterpret_cast<Function*>(functionOf(module, name));
}

QrComponentManager& managerOf(void* module) {
    return *find<GetManager>(module, function)();
}

void useWithoutComponents() {
    void* const module = load();
    managerOf(module).initialize(nowhere.c_str());
    unloadAsHost(module);
}

/// Leaves entries in the registries. They never dereference these pointers.
void leaveEntries() {
    void* const module = load();
    static char anything[3];
    for (char& address : anything)
        find<AddTranslation>(module, "QrAddTranslation")(reinterpret_cast<QrCastable*>(&address),
                                                         reinterpret_cast<QrCastable*>(anything),
                                                         [](const QrUid&) { return false; });
    find<SetController>(module, "QrSetThreadProcessController")(anything);
    if (find<GetController>(module, "QrGetProcessController")() != anything)
        std::puts("another controller");
    managerOf(module).initialize(nowhere.c_str());
    unloadAsHost(module);
}

void measureGrowth() {
    // A plug-in leaves its entries itself.
    const auto cycle = [] {
        std::string_view(function) == "QrGetComponentManager" ? leaveEntries()
                                                              : useWithoutComponents();
        forgetNotes();
    };
    for (int warmUp = 0; warmUp < 50; ++warmUp)
        cycle();
    constexpr std::size_t cycles = 1000;
    const std::size_t handles = openHandles();
    const std::size_t before = allocatedBytes();
    for (std::size_t count = 0; count < cycles; ++count)
        cycle();
    // Allow less than one byte per cycle: the memory of the loader and the heap varies a little.
    const std::size_t after = allocatedBytes();
    if (openHandles() != handles)
        std::printf("has %zu handles instead of %zu\n", openHandles(), handles);
    if (after < before + cycles)
        std::puts("did not grow");
    else
        std::printf("grew by %zu bytes\n", after - before);
}

void cycleOnThreads() {
    std::vector<std::thread> threads;
    for (int count = 0; count < 4; ++count)
        threads.emplace_back([] {
            for (int cycle = 0; cycle < 75; ++cycle)
                unloadAsHost(load());
        });
    for (std::thread& thread : threads)
        thread.join();
}

void makeObject(void* module, const std::wstring& path) {
    managerOf(module).initialize(path.c_str());
    if (!managerOf(module).createObject(kitUid))
        std::puts("made nothing");
}

void useComponent(const std::wstring& path) {
    void* const module = load();
    makeObject(module, path);
    unloadAsHost(module);
}

void useComponentOnThread(const std::wstring& path) {
    void* const module = load();
    std::thread(makeObject, module, path).join();
    unloadAsHost(module);
}

} // namespace

int main(int argc, char** argv) {
    if (argc < 5)
        return 2;
    library = argv[1];
    function = argv[2];
    const std::string mode = argv[3];
    nowhere = searchPathOf(std::filesystem::path(argv[4]).parent_path() / "nowhere");
    const std::wstring folder = searchPathOf(std::filesystem::path(argv[4]).parent_path());
    for (int cycle = 0; cycle < 300 && mode == "cycles"; ++cycle)
        useWithoutComponents();
    if (mode == "growth")
        measureGrowth();
    if (mode == "threads")
        cycleOnThreads();
    for (int cycle = 0; cycle < 300 && mode == "component"; ++cycle)
        useComponent(folder);
    if (mode == "thread")
        useComponentOnThread(folder);
    if (mode == "copy") {
        useComponent(folder);
        std::printf("the copy ended with %d\n", exitCodeOfCopy());
    }
    for (int index = 4; index < argc; ++index)
        std::printf("%s %s\n", isMapped(argv[index]) ? "mapped" : "unmapped",
                    std::filesystem::path(argv[index]).stem().string().c_str());
    for (const char* event : {"first", "last", "wrong"})
        if (noted(event) > 0)
            std::printf("%s %d\n", event, noted(event));
}
