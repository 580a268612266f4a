// SPDX-License-Identifier: BSL-1.0
/// The commands of mzcomponents. Each writes its result to standard output and errors to standard
/// error, and returns the exit status.
#pragma once

#include "components/componentTools/console.h"
#include "components/componentTools/scan.h"
#include "tools/mzcomponents/hostOption.h"

#include <chrono>
#include <cstdint>
#include <filesystem>
#include <string>
#include <vector>

namespace Mz::Commands {

// The exit statuses.
inline constexpr int exitSuccess = 0;
inline constexpr int exitFailure = 1; ///< a library, file or folder is faulty, or output failed
inline constexpr int exitUsage = 2;

/// The options of every command.
struct Common {
    std::string path = "."; ///< folders as in the argument, separated by ';'
    std::string cache;      ///< the recorded list; empty for none
    bool json = false;
    HostFiles host;
};

struct ExplainArguments {
    std::vector<std::string> files;
    std::string path; ///< the search path of a host; empty for none
    bool load = false;
};

struct ProbeArguments {
    double seconds = 10;
    unsigned int mebibytes = 1024;
    bool retry = false;
    unsigned int jobs = 1; ///< 0 for the number of processors

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
    bool guarded = false; ///< import in child processes
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
