// SPDX-License-Identifier: BSL-1.0
/// The command `bisect`: its options, and how it runs.
#pragma once

#include "tools/mzcomponents/commands.h"

#include <string>
#include <vector>

namespace CLI {
class App;
}

namespace Mz::Commands {

/// The options of `bisect`.
struct BisectArguments {
    std::vector<std::string> host; ///< the program and its arguments
    int repeat = 1;
    double time = 0; ///< when the host is killed, in seconds; 0 for the default
    bool runningIsGood = false;
    bool ask = false;
};

/// Adds the options that only this command has.
/// \param arguments  receives them, and must outlive the parser
void addBisectOptions(CLI::App& command, BisectArguments& arguments);

/// Searches the component with which the host fails, and writes a report.
int bisect(const Common& common, const BisectArguments& arguments, const ProbeArguments& probe);

} // namespace Mz::Commands
