// SPDX-License-Identifier: BSL-1.0
/// Measures what a guard costs: mzGuardedImport FOLDER
///
/// Imports a mesh of 330 KB through the mesh components in FOLDER, plainly and guarded in turn, and
/// prints the medians of both and their difference. It is a separate program, because the component
/// manager of the other benchmarks knows a thousand libraries.
#include "sphere.h"

#include "components/componentKit/hostKit.h"
#include "components/componentTools/guardedImport.h"

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <functional>
#include <stdexcept>
#include <string>
#include <unistd.h>
#include <vector>

namespace {

using namespace Mz;

constexpr int repetitions = 101;

/// Returns the time of `work` in milliseconds.
double timeOf(const std::function<bool()>& work) {
    const auto begin = std::chrono::steady_clock::now();
    if (!work())
        throw std::runtime_error("an import failed");
    return std::chrono::duration<double, std::milli>(std::chrono::steady_clock::now() - begin)
        .count();
}

double median(std::vector<double> values) {
    const auto middle = values.begin() + static_cast<std::ptrdiff_t>(values.size() / 2);
    std::nth_element(values.begin(), middle, values.end());
    return *middle;
}

int measure(const std::filesystem::path& components, const std::filesystem::path& file) {
    std::ofstream(file, std::ios::binary) << Benchmarks::sphere();
    Kit::initialize(components);
    const auto importer = Kit::newImporter<L"mesh">();
    Kit::ImportLimits limits;
    limits.builderName = L"mesh";
    const auto plain = [&] {
        bool found = false;
        return static_cast<bool>(importer->import(Kit::wideName(file).c_str(), nullptr, found));
    };
    const auto guarded = [&] {
        const Kit::GuardedImport import = Kit::importGuarded(file, limits);
        if (!import)
            std::printf("%s\n", toNarrow(import.sentence(), '?').c_str());
        return static_cast<bool>(import);
    };
    timeOf(plain); // Loads the libraries.
    std::vector<double> plainTimes, guardedTimes;
    for (int count = 0; count < repetitions; ++count) {
        plainTimes.push_back(timeOf(plain));
        guardedTimes.push_back(timeOf(guarded));
    }
    const double cost = median(guardedTimes) - median(plainTimes);
    std::printf("%ju bytes: plain %.2f ms, guarded %.2f ms, difference %.2f ms (reach: 10 ms)\n",
                std::uintmax_t{std::filesystem::file_size(file)}, median(plainTimes),
                median(guardedTimes), cost);
    return 0;
}

} // namespace

int main(int argc, char** argv) {
    const std::filesystem::path file =
        std::filesystem::temp_directory_path() / ("sphere" + std::to_string(::getpid()) + ".obj");
    int status = 1;
    try {
        if (argc == 2)
            status = measure(argv[1], file);
        else
            std::fputs("mzGuardedImport FOLDER\n", stderr);
    } catch (const std::exception& failure) {
        std::fprintf(stderr, "%s\n", failure.what());
    }
    std::filesystem::remove(file);
    return status;
}
