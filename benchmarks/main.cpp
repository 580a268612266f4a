// SPDX-License-Identifier: BSL-1.0
/// Measures the library, each work together with its limit, and prints a table of ratios.
#include "comparisons.h"

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

/// Returns the default options followed by those of the command line, which override them.
/// `--ratios_out` is removed; its value goes to `ratiosFile`.
std::vector<std::string> optionsOf(int argc, char** argv, std::string& ratiosFile) {
    std::vector<std::string> options{argv[0], "--benchmark_repetitions=25",
                                     "--benchmark_enable_random_interleaving=true",
                                     "--benchmark_min_time=0.04"};
    for (int index = 1; index < argc; ++index) {
        const std::string_view option = argv[index];
        if (option.starts_with(ratiosOption))
            ratiosFile = option.substr(ratiosOption.size());
        else
            options.emplace_back(option);
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

int run(int argc, char** argv) {
    std::string ratiosFile;
    std::vector<std::string> options = optionsOf(argc, argv, ratiosFile);
    if (!initializeLibrary(options))
        return 2;
    RatioTable table;
    addCastComparisons(table);
    addCreateComparisons(table);
    addStartComparisons(table);
    addControllerComparisons(table);
    addStreamComparisons(table);
    addMediaComparisons(table);
    addToolsComparisons(table);
    addScanComparisons(table);

    stayOnOneCore();
    {
        const SecondThread second;
        RatioReporter reporter(table);
        benchmark::RunSpecifiedBenchmarks(&reporter);
    }
    benchmark::Shutdown();
    table.print(std::cout);
    if (!ratiosFile.empty()) {
        std::ofstream out(ratiosFile);
        table.printJson(out);
        if (!out.flush()) {
            std::cerr << "cannot write " << ratiosFile << '\n';
            return 1;
        }
    }
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
