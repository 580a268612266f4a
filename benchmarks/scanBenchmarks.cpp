// SPDX-License-Identifier: BSL-1.0
// Scans, compared with the processes that they must start and the files that they must read.
#include "comparisons.h"
#include "libraryFolder.h"

#include "components/componentTools/scan.h"

#include <dirent.h>
#include <fcntl.h>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <memory>
#include <spawn.h>
#include <string>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

namespace Mz::Benchmarks {

namespace {

/// A folder of component libraries with a list, made when the first benchmark needs it.
class ScannedFolder {
  public:
    explicit ScannedFolder(unsigned int libraryCount) : count(libraryCount) {}
    ~ScannedFolder() { forget(); }
    ScannedFolder(const ScannedFolder&) = delete;
    ScannedFolder& operator=(const ScannedFolder&) = delete;

    const std::filesystem::path& path() {
        if (!folder)
            folder = std::make_unique<LibraryFolder>(MZ_BENCHMARK_COMPONENT, count);
        return folder->path();
    }

    std::filesystem::path list() { return path().string() + ".list"; }

    /// Removes the list.
    void forget() {
        std::error_code ignored;
        if (folder)
            for (const char* suffix : {".list", ".list.verdicts.json"})
                std::filesystem::remove(folder->path().string() + suffix, ignored);
    }

    /// Returns whether the scan found all libraries.
    bool scan() {
        Tools::ScanOptions options;
        options.folders = {path()};
        options.list = list();
        const Tools::ScanResult result = Tools::scan(options);
        return result.libraries.size() == count && result.notWritten.empty();
    }

    const unsigned int count;

  private:
    std::unique_ptr<LibraryFolder> folder;
};

void scanNew(benchmark::State& state, ScannedFolder& folder) {
    for (auto iteration : state) {
        static_cast<void>(iteration);
        folder.forget();
        if (!folder.scan())
            return state.SkipWithError("a library was not recorded");
    }
}

void startProcesses(benchmark::State& state, unsigned int count) {
    char* const arguments[] = {const_cast<char*>(MZ_BENCHMARK_EMPTY), nullptr};
    for (auto iteration : state) {
        static_cast<void>(iteration);
        for (unsigned int started = 0; started < count; ++started) {
            pid_t process = 0;
            int status = 0;
            if (::posix_spawn(&process, MZ_BENCHMARK_EMPTY, nullptr, nullptr, arguments, environ) ||
                ::waitpid(process, &status, 0) != process || status != 0)
                return state.SkipWithError("a process failed");
        }
    }
}

void scanUnchanged(benchmark::State& state, ScannedFolder& folder) {
    if (!folder.scan())
        return state.SkipWithError("a library was not recorded");
    for (auto iteration : state) {
        static_cast<void>(iteration);
        if (!folder.scan())
            return state.SkipWithError("a library was not recorded");
    }
}

void readOnce(const std::string& file) {
    struct stat status;
    char block[4096];
    const int descriptor =
        ::stat(file.c_str(), &status) == 0 ? ::open(file.c_str(), O_RDONLY | O_CLOEXEC) : -1;
    if (descriptor < 0)
        return;
    benchmark::DoNotOptimize(::read(descriptor, block, sizeof block));
    ::close(descriptor);
}

/// Lists the folder, reads one block of each file, and the list.
void readFiles(benchmark::State& state, ScannedFolder& folder) {
    if (!folder.scan())
        return state.SkipWithError("a library was not recorded");
    const std::string path = folder.path().string();
    for (auto iteration : state) {
        static_cast<void>(iteration);
        DIR* const directory = ::opendir(path.c_str());
        while (const dirent* const entry = directory ? ::readdir(directory) : nullptr)
            if (entry->d_name[0] != '.')
                readOnce(path + "/" + entry->d_name);
        if (directory)
            ::closedir(directory);
        std::ifstream stream(folder.list(), std::ios::binary);
        std::string list(std::istreambuf_iterator<char>(stream), {});
        benchmark::DoNotOptimize(list.data());
    }
}

} // namespace

void addScanComparisons(RatioTable& table) {
    const auto few = std::make_shared<ScannedFolder>(50);
    table.add(
        {"scan/new", "scan of 50 new libraries, one job",
         "start of 50 processes that do nothing, their ends", std::nullopt},
        [few](benchmark::State& state) { scanNew(state, *few); },
        [few](benchmark::State& state) { startProcesses(state, few->count); });
    const auto many = std::make_shared<ScannedFolder>(1000);
    table.add(
        {"scan/unchanged", "scan of 1,000 unchanged libraries",
         "list, status, open, one read, close; read the list", std::nullopt},
        [many](benchmark::State& state) { scanUnchanged(state, *many); },
        [many](benchmark::State& state) { readFiles(state, *many); });
}

} // namespace Mz::Benchmarks
