// SPDX-License-Identifier: BSL-1.0
/// The command `profile`: its options, and how it runs.
#pragma once

#include "tools/mzcomponents/commands.h"

#include <functional>
#include <string>

namespace CLI {
class App;
}

namespace Mz::Commands {

/// The options of `profile`.
struct ProfileArguments {
    std::string svg; ///< the name of the chart's file; empty for none
    int runs = 5;
};

/// Adds the options that only this command has.
/// \param arguments  receives them, and must outlive the parser
void addProfileOptions(CLI::App& command, ProfileArguments& arguments);

/// Measures where the time of a start goes, and writes it.
int profile(const Common& common, const ProfileArguments& arguments, const ProbeArguments& probe);

} // namespace Mz::Commands
