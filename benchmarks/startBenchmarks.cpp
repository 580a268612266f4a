// SPDX-License-Identifier: BSL-1.0
// The start of the manager in new processes, compared with the calls that it cannot avoid.
#include "comparisons.h"
#include "freshProcess.h"
#include "libraryFolder.h"

#include <exception>
#include <memory>
#include <string>
#include <utility>

namespace Mz::Benchmarks {

namespace {

/// A folder that is made when the first benchmark needs it, and shared with others.
class LazyFolder {
  public:
    /// `preparation` is the work that is done once on the new folder.
    LazyFolder(std::string libraryFile, unsigned int libraryCount,
               std::string preparation = "initialize")
        : library(std::move(libraryFile)), count(libraryCount), firstWork(std::move(preparation)) {}

    const std::filesystem::path& path() {
        if (!folder) {
            folder = std::make_unique<LibraryFolder>(library, count);
            // Not measured: brings every file into the page cache.
            inFreshProcess(firstWork, folder->path());
        }
        return folder->path();
    }

  private:
    std::string library;
    unsigned int count;
    std::string firstWork;
    std::unique_ptr<LibraryFolder> folder;
};

/// Returns a benchmark of `work` in new processes. Each must find `expected` libraries.
RatioTable::Body freshly(std::string work, std::shared_ptr<LazyFolder> folder, long expected) {
    return [=](benchmark::State& state) {
        for (auto iteration : state) {
            static_cast<void>(iteration);
            try {
                const FreshResult result = inFreshProcess(work, folder->path());
                state.SetIterationTime(result.seconds);
                if (result.count != expected)
                    state.SkipWithError((work + " found " + std::to_string(result.count) + " of " +
                                         std::to_string(expected))
                                            .c_str());
            } catch (const std::exception& failure) {
                state.SkipWithError(failure.what());
            }
        }
    };
}

void addFirstStart(RatioTable& table, unsigned int count, const std::string& countText) {
    const auto folder = std::make_shared<LazyFolder>(MZ_BENCHMARK_COMPONENT, count);
    table.addSelfTimed({"start/first" + std::to_string(count),
                        "first start, " + countText + " libraries",
                        "dlopen, dlsym and call, libraries kept", 1.12},
                       freshly("initialize", folder, count), freshly("load", folder, count));
}

void addRecordedStart(RatioTable& table, unsigned int count, const std::string& countText) {
    const auto folder = std::make_shared<LazyFolder>(MZ_BENCHMARK_COMPONENT, count, "record");
    table.addSelfTimed({"start/recorded" + std::to_string(count),
                        "start with a recorded list, " + countText + " libraries",
                        "list, status, read the list, fill a map", 1.6},
                       freshly("initializeRecorded", folder, count),
                       freshly("readList", folder, count));
}

} // namespace

void addStartComparisons(RatioTable& table) {
    addFirstStart(table, 100, "100");
    addFirstStart(table, 1000, "1,000");

    const auto bystanders = std::make_shared<LazyFolder>(MZ_BENCHMARK_BYSTANDER, 1000);
    table.addSelfTimed({"start/bystanders", "1,000 candidates without the entry point",
                        "list, status, one read of the symbol table", 1.1},
                       freshly("initialize", bystanders, 0),
                       freshly("readTables", bystanders, 1000));

    addRecordedStart(table, 100, "100");
    addRecordedStart(table, 1000, "1,000");
    addRecordedStart(table, 4000, "4,000");
}

} // namespace Mz::Benchmarks
