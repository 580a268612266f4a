// SPDX-License-Identifier: BSL-1.0
// Initialises the manager when the first benchmark needs it: a process can do that only once.
#include "manager.h"

#include "libraryFolder.h"

namespace Mz::Benchmarks {

const std::filesystem::path& generatedFolder() {
    static const LibraryFolder folder(MZ_BENCHMARK_COMPONENT, builderCount);
    return folder.path();
}

QrComponentManager* initializedManager() {
    const std::filesystem::path& folder = generatedFolder(); // Removed after the last use.
    QrComponentManager* const manager = QrGetComponentManager();
    const std::wstring others =
        std::filesystem::path(MZ_BENCHMARK_OTHER_COMPONENTS ";" MZ_BENCHMARK_MESH).wstring();
    manager->initialize((folder.wstring() + L";" + others).c_str());
    return manager;
}

} // namespace Mz::Benchmarks
