// SPDX-License-Identifier: BSL-1.0
/// Measures the library, each work together with its limit, and prints a table of ratios.
#include "comparisons.h"
#include "memory.h"
#include "ratioReporter.h"

#include "peers/registration.h"

#include <condition_variable>
#include <exception>
#include <fstream>
#include <iostream>
#include <mutex>
#include <sched.h>
#include <string>
#include <string_view>
#include <thread>
#include <vector>

using namespace Mz::Benchmarks;

namespace {

constexpr std::string_view ratiosOption = "--ratios_out=";
constexpr std::string_view memoryFilter = "--benchmark_filter=memory";

/// An idle second thread while it lives. The standard library's reference counts are atomic only in
/// programs with several threads, as most programs are.
class SecondThread {
  public:
    SecondThread() : thread([this] { waitForEnd(); }) {}
    ~SecondThread() {
        {
            const std::lock_guard lock(mutex);
            ended = true;
        }
        changed.notify_one();
        thread.join();
    }

  private:
    void waitForEnd() {
        std::unique_lock lock(mutex);
        changed.wait(lock, [this] { return ended; });
    }

    std::mutex mutex;
    std::condition_variable changed;
    bool ended = false;
    std::thread thread;
};

/// Binds this process, and those that it starts, to the current core.
void stayOnOneCore() {
    cpu_set_t cores;
    CPU_ZERO(&cores);
    CPU_SET(static_cast<unsigned int>(::sched_getcpu()), &cores);
    if (::sched_setaffinity(0, sizeof cores, &cores) != 0)
        std::cerr << "could not stay on one core\n";
}

/// What the command line asks for, beside the options of Google Benchmark.
struct Options {
    std::vector<std::string> forLibrary; ///< defaults first, which those of the user override
    std::string ratiosFile;              ///< empty for none
    bool memory = true;                  ///< measure memory, too
};

Options optionsOf(int argc, char** argv) {
    Options options;
    options.forLibrary = {argv[0], "--benchmark_repetitions=15",
                          "--benchmark_enable_random_interleaving=true",
                          "--benchmark_min_time=0.04"};
    for (int index = 1; index < argc; ++index) {
        const std::string_view option = argv[index];
        if (option.starts_with(ratiosOption)) {
            options.ratiosFile = option.substr(ratiosOption.size());
            continue;
        }
        // A filter selects the times; the memory is measured with all of them, or by itself.
        if (option.starts_with("--benchmark_filter=") ||
            option.starts_with("--benchmark_list_tests"))
            options.memory = option == memoryFilter;
        options.forLibrary.emplace_back(option);
    }
    return options;
}

bool initializeLibrary(std::vector<std::string>& options) {
    std::vector<char*> arguments;
    arguments.reserve(options.size());
    for (std::string& option : options)
        arguments.push_back(option.data());
    int count = static_cast<int>(arguments.size());
    benchmark::Initialize(&count, arguments.data());
    return !benchmark::ReportUnrecognizedArguments(count, arguments.data());
}

void addComparisons(RatioTable& table) {
    addCastComparisons(table);
    addCreateComparisons(table);
    addStartComparisons(table);
    addLargeStartComparisons(table);
    addControllerComparisons(table);
    addStreamComparisons(table);
    addMediaComparisons(table);
    addObjectComparisons(table);
    addImportComparisons(table);
    addToolsComparisons(table);
    addScanComparisons(table);
    PeerRegistration::addAll(table);
}

bool writeRatios(const std::string& file, const RatioTable& table,
                 const std::vector<MemoryLine>& memory) {
    std::ofstream out(file);
    writeJson(out, {MZ_BENCHMARK_COMPILER, MZ_BENCHMARK_OPTIONS, table.repetitionCount()},
              table.ratioLines(), memory);
    if (out.flush())
        return true;
    std::cerr << "cannot write " << file << '\n';
    return false;
}

int run(int argc, char** argv) {
    Options options = optionsOf(argc, argv);
    if (!initializeLibrary(options.forLibrary))
        return 2;
    RatioTable table;
    addComparisons(table);

    stayOnOneCore();
    {
        const SecondThread second;
        RatioReporter reporter(table);
        benchmark::RunSpecifiedBenchmarks(&reporter);
    }
    benchmark::Shutdown();
    table.print(std::cout);
    std::vector<MemoryLine> memory;
    if (options.memory) {
        memory = measureMemory();
        std::cout << '\n';
        printMemory(std::cout, memory);
    }
    if (!options.ratiosFile.empty() && !writeRatios(options.ratiosFile, table, memory))
        return 1;
    return table.failed() ? 1 : 0;
}

} // namespace

int main(int argc, char** argv) {
    try {
        return run(argc, argv);
    } catch (const std::exception& failure) {
        std::cerr << failure.what() << '\n';
        return 1;
    }
}
