// SPDX-License-Identifier: BSL-1.0
/// The command `check`: its options, and how it runs.
#pragma once

#include "tools/mzcomponents/commands.h"

#include <cstdint>
#include <functional>
#include <string>
#include <vector>

namespace CLI {
class App;
}

namespace Mz::Commands {

/// The options of `check`.
struct CheckArguments {
    std::vector<std::string> files, samples;
    std::string path; ///< folders whose libraries are checked, too; empty for none
    HostFiles host;
    std::string failOn = "error";
    std::string suppressions, junit, sarif; ///< names of files; empty for none
    std::string explained;                  ///< a rule to explain instead of a check
    std::string reproduce;
    std::uint32_t seed = 1;
    double fuzzSeconds = 0;
    unsigned int jobs = 0; ///< 0 for the number of processors
    bool inProcess = false, threadSafe = false, json = false;
};

/// Adds the command to the parser.
/// \param arguments, probe  receive the options, and must outlive the parser
/// \param command           receives the command to run
void addCheckCommand(CLI::App& app, CheckArguments& arguments, ProbeArguments& probe,
                     std::function<int()>& command);

/// Checks component libraries and writes what is wrong with them.
int check(const CheckArguments& arguments, const ProbeArguments& probe);

} // namespace Mz::Commands
