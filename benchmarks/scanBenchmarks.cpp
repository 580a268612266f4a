// SPDX-License-Identifier: BSL-1.0
// Scans, compared with the processes that they must start and the files that they must read.
#include "comparisons.h"
#include "libraryFolder.h"

#include "components/componentTools/scan.h"

#include <chrono>
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

using Clock = std::chrono::steady_clock;

/// Measures the time that passes, not that of this process: a scan waits for others.
template <class Work>
void measure(benchmark::State& state, Work work) {
    for (auto iteration : state) {
        static_cast<void>(iteration);
        const Clock::time_point begin = Clock::now();
        if (!work())
            return state.SkipWithError("a library or a process failed");
        state.SetIterationTime(std::chrono::duration<double>(Clock::now() - begin).count());
    }
}

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

    /// Scans, unless there is a list.
    void scanFirst() {
        if (!std::filesystem::exists(list()))
            scan();
    }

    const unsigned int count;

  private:
    std::unique_ptr<LibraryFolder> folder;
};

bool startProcesses(unsigned int count) {
    char* const arguments[] = {const_cast<char*>(MZ_BENCHMARK_EMPTY), nullptr};
    for (unsigned int started = 0; started < count; ++started) {
        pid_t process = 0;
        int status = 0;
        if (::posix_spawn(&process, MZ_BENCHMARK_EMPTY, nullptr, nullptr, arguments, environ) ||
            ::waitpid(process, &status, 0) != process || status != 0)
            return false;
    }
    return true;
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
bool readFiles(ScannedFolder& folder) {
    const std::string path = folder.path().string();
    DIR* const directory = ::opendir(path.c_str());
    if (!directory)
        return false;
    while (const dirent* const entry = ::readdir(directory))
        if (entry->d_name[0] != '.')
            readOnce(path + "/" + entry->d_name);
    ::closedir(directory);
    std::ifstream stream(folder.list(), std::ios::binary);
    std::string list(std::istreambuf_iterator<char>(stream), {});
    benchmark::DoNotOptimize(list.data());
    return !list.empty();
}

} // namespace

void addScanComparisons(RatioTable& table) {
    const auto few = std::make_shared<ScannedFolder>(50);
    table.addSelfTimed(
        {"scan/new", "scan of 50 new libraries, one job",
         "start of 50 processes that do nothing, their ends"},
        [few](benchmark::State& state) {
            measure(state, [&] {
                few->forget();
                return few->scan();
            });
        },
        [few](benchmark::State& state) {
            measure(state, [&] { return startProcesses(few->count); });
        });
    const auto many = std::make_shared<ScannedFolder>(1000);
    table.addSelfTimed(
        {"scan/unchanged", "scan of 1,000 unchanged libraries",
         "list, status, open, one read, close; read the list"},
        [many](benchmark::State& state) {
            many->scanFirst();
            measure(state, [&] { return many->scan(); });
        },
        [many](benchmark::State& state) {
            many->scanFirst();
            measure(state, [&] { return readFiles(*many); });
        });
}

} // namespace Mz::Benchmarks
