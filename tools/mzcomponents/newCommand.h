// SPDX-License-Identifier: BSL-1.0
/// The command `new`: its options, and how it runs.
#pragma once

#include "tools/mzcomponents/project.h"

#include <functional>
#include <string>

namespace CLI {
class App;
}

namespace Mz::Commands {

/// The options of `new`.
struct NewArguments {
    Project project;
    std::string directory; ///< empty for a folder with the name of the project
};

/// Adds the command, with a subcommand for each kind of project, to the parser.
/// \param arguments  receives the options, and must outlive the parser
/// \param command    receives the command to run
void addNewCommand(CLI::App& app, NewArguments& arguments, std::function<int()>& command);

/// Writes a new project, and the commands to run next.
int newProject(const NewArguments& arguments);

} // namespace Mz::Commands
