// SPDX-License-Identifier: BSL-1.0
/// Measures the library on Windows, each work together with its limit, and prints a table of
/// ratios: mzWindowsBenchmarks [--filter=TEXT] [--repetitions=N]
///
/// The repetitions run one after the other through all benchmarks, forwards and backwards in turn.
/// So work and limit of a line are measured directly after one another, each of them as often
/// first.
///
/// Libraries that a process has loaded cannot be removed before it ends. So the program starts
/// itself again with a new folder for temporary files, and removes that at the end. The folder is
/// beside the program, because names in a build folder are in lower case. The manager asks for
/// files in lower case, and Wine would search each folder on the way for a name in another case,
/// which Windows does not.
#include "comparisons.h"
#include "temporaryName.h"

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <exception>
#include <iostream>
#include <map>
#include <process.h>
#include <string>
#include <string_view>
#include <vector>

using namespace Mz::Benchmarks;

namespace {

/// The environment variable for the folder of temporary files. The system reads it, too.
constexpr const char* folderVariable = "TMP";
/// Tells the second process that it is the one.
constexpr const char* measuringVariable = "MZ_BENCHMARK_MEASURES";

/// The time that a repetition takes at least, in seconds.
constexpr double leastTime = 0.04;

struct Options {
    std::string filter;
    int repetitions = 9;
};

/// Returns whether all arguments are options.
bool readOptions(int argc, char** argv, Options& options) {
    constexpr std::string_view filter = "--filter=", repetitions = "--repetitions=";
    for (int index = 1; index < argc; ++index) {
        const std::string_view argument = argv[index];
        if (argument.starts_with(filter))
            options.filter = argument.substr(filter.size());
        else if (argument.starts_with(repetitions))
            options.repetitions = std::atoi(argv[index] + repetitions.size());
        else
            return false;
    }
    return options.repetitions > 0;
}

void addComparisons(RatioTable& table) {
    addCastComparisons(table);
    addCreateComparisons(table);
    addStartComparisons(table);
    addControllerComparisons(table);
    addStreamComparisons(table);
    addMediaComparisons(table);
    addObjectComparisons(table);
    addImportComparisons(table);
}

/// Runs benchmarks and passes their times to the table.
class Runner {
  public:
    explicit Runner(RatioTable& target) : table(target) {}

    void run(const benchmark::Benchmark& benchmark) {
        if (failed[benchmark.name()])
            return;
        if (benchmark.iterations() == 0 && !iterations.contains(benchmark.name()))
            findIterations(benchmark);
        benchmark::State state = runOnce(benchmark);
        if (!state.errorMessage().empty()) {
            failed[benchmark.name()] = true;
            table.noteError(benchmark.name(), state.errorMessage());
            return;
        }
        table.note(benchmark.name(),
                   secondsOf(benchmark, state) * 1e9 / static_cast<double>(state.iterations()));
    }

  private:
    benchmark::State runOnce(const benchmark::Benchmark& benchmark) {
        benchmark::State state(benchmark.iterations() > 0 ? benchmark.iterations()
                                                          : iterations[benchmark.name()]);
        benchmark.body()(state);
        return state;
    }

    static double secondsOf(const benchmark::Benchmark& benchmark, const benchmark::State& state) {
        return state.seconds(benchmark.usesManualTime());
    }

    /// Increases the number of iterations until they take long enough. This warms up, too.
    void findIterations(const benchmark::Benchmark& benchmark) {
        std::int64_t& count = iterations[benchmark.name()];
        count = 1;
        while (true) {
            const benchmark::State state = runOnce(benchmark);
            const double seconds = secondsOf(benchmark, state);
            if (seconds >= leastTime || !state.errorMessage().empty())
                return;
            const double factor = std::clamp(1.4 * leastTime / std::max(seconds, 1e-9), 2.0, 100.0);
            count = static_cast<std::int64_t>(static_cast<double>(state.iterations()) * factor);
        }
    }

    RatioTable& table;
    std::map<std::string, std::int64_t> iterations;
    std::map<std::string, bool> failed;
};

int measure(const Options& options) {
    RatioTable table;
    addComparisons(table);
    std::vector<const benchmark::Benchmark*> chosen;
    for (const benchmark::Benchmark& benchmark : benchmark::registeredBenchmarks())
        if (benchmark.name().find(options.filter) != std::string::npos)
            chosen.push_back(&benchmark);
    Runner runner(table);
    for (int repetition = 1; repetition <= options.repetitions; ++repetition) {
        std::cerr << "repetition " << repetition << " of " << options.repetitions << std::endl;
        for (const benchmark::Benchmark* benchmark : chosen)
            runner.run(*benchmark);
        std::reverse(chosen.begin(), chosen.end());
    }
    table.print(std::cout);
    return table.failed() ? 1 : 0;
}

/// Runs this program again with another folder for temporary files, and removes that folder.
int measureInFolder(char** argv) {
    const std::filesystem::path folder =
        temporaryName("measured", {}, std::filesystem::path(_pgmptr).parent_path());
    std::filesystem::create_directory(folder);
    ::_putenv((folderVariable + ("=" + folder.string())).c_str());
    ::_putenv((measuringVariable + std::string("=1")).c_str());
    const std::intptr_t status = ::_spawnv(_P_WAIT, _pgmptr, argv);
    std::error_code ignored;
    std::filesystem::remove_all(folder, ignored);
    return static_cast<int>(status);
}

} // namespace

int main(int argc, char** argv) {
    try {
        Options options;
        if (!readOptions(argc, argv, options)) {
            std::cerr << "usage: mzWindowsBenchmarks [--filter=TEXT] [--repetitions=N]\n";
            return 2;
        }
        return std::getenv(measuringVariable) ? measure(options) : measureInFolder(argv);
    } catch (const std::exception& failure) {
        std::cerr << failure.what() << '\n';
        return 1;
    }
}
