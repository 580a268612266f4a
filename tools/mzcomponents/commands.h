// SPDX-License-Identifier: BSL-1.0
/// The commands of mzcomponents. Each writes its result to standard output, says what went wrong on
/// standard error, and returns the exit status.
#pragma once

#include "components/componentTools/console.h"
#include "components/componentTools/scan.h"

#include <chrono>
#include <cstdint>
#include <filesystem>
#include <string>
#include <vector>

namespace Mz::Commands {

/// Exit statuses.
inline constexpr int good = 0;
inline constexpr int subjectIsWrong = 1; ///< a library, a file or a folder
inline constexpr int wrongUse = 2;

/// What every command takes.
struct Common {
    std::string path = "."; ///< as given: folders, separated by ';'
    std::string cache;      ///< the recorded list; empty for none
    bool json = false;
};

struct ExplainArguments {
    std::vector<std::string> files;
    std::string path; ///< of a host, as given; empty if none was
    bool load = false;
};

struct ProbeArguments {
    double seconds = 10;
    unsigned int mebibytes = 1024;
    bool retry = false;

    Tools::ProbeOptions options() const {
        Tools::ProbeOptions result;
        result.timeLimit = std::chrono::milliseconds(static_cast<long long>(seconds * 1000));
        result.memoryLimit = std::uint64_t{mebibytes} << 20;
        return result;
    }
};

struct ImportArguments {
    std::vector<std::string> files;
    std::string save;
};

struct GraphArguments {
    std::string output, svg;
};

int list(const Common& common);
int explain(const Common& common, const ExplainArguments& arguments, const ProbeArguments& probe);
int scan(const Common& common, const ProbeArguments& probe);
int types(const Common& common, const ProbeArguments& probe);
int importFiles(const Common& common, const ImportArguments& arguments,
                const ProbeArguments& probe);
int show(const Common& common, const std::string& file, const ProbeArguments& probe);
int graph(const Common& common, const GraphArguments& arguments, const ProbeArguments& probe);

} // namespace Mz::Commands
