// SPDX-License-Identifier: BSL-1.0
/// The commands `disable` and `enable`: their options, and how they run.
#pragma once

#include <functional>
#include <string>
#include <vector>

namespace CLI {
class App;
}

namespace Mz::Commands {

/// The options of `disable` and `enable`.
struct SwitchArguments {
    std::vector<std::string> files;
    std::string cache;
    std::string reason;
};

/// Adds the commands to the parser.
/// \param arguments  receives the options, and must outlive the parser
/// \param command    receives the command to run
void addSwitchCommands(CLI::App& app, SwitchArguments& arguments, std::function<int()>& command);

/// Switches the components off.
int disable(const SwitchArguments& arguments);

/// Switches the components on.
int enable(const SwitchArguments& arguments);

} // namespace Mz::Commands
