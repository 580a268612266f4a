// SPDX-License-Identifier: BSL-1.0
// Keeps each folder until the program ends, since several benchmarks use it.
#include "startFolders.h"

#include "freshProcess.h"

#include <map>
#include <utility>

namespace Mz::Benchmarks {

LazyFolder::LazyFolder(std::string libraryFile, unsigned int libraryCount, std::string preparation,
                       std::string program)
    : library(std::move(libraryFile)), count(libraryCount), firstWork(std::move(preparation)),
      worker(std::move(program)) {}

const std::filesystem::path& LazyFolder::path() {
    if (!folder) {
        folder = std::make_unique<LibraryFolder>(library, count);
        // Not measured: brings every file into the page cache.
        inFreshProcess(firstWork, folder->path(), worker);
    }
    return folder->path();
}

SharedFolder componentFolder(unsigned int count) {
    static std::map<unsigned int, SharedFolder> folders;
    SharedFolder& folder = folders[count];
    if (!folder)
        folder = std::make_shared<LazyFolder>(MZ_BENCHMARK_COMPONENT, count, "record");
    return folder;
}

SharedFolder bystanderFolder() {
    static const auto folder = std::make_shared<LazyFolder>(MZ_BENCHMARK_BYSTANDER, 1000);
    return folder;
}

} // namespace Mz::Benchmarks
