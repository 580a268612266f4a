// SPDX-License-Identifier: BSL-1.0
/// The command `help`: what the documentation says of one verdict, rule or reason.
#pragma once

#include <functional>
#include <string>

namespace CLI {
class App;
}

namespace Mz::Commands {

/// Adds the command to the parser.
/// \param topic    receives the topic, and must outlive the parser
/// \param command  receives the command to run
void addHelpCommand(CLI::App& app, std::string& topic, std::function<int()>& command);

/// Writes the section on the topic; with an empty topic, the names of all topics. An unknown topic
/// is wrong use.
int help(const std::string& topic);

} // namespace Mz::Commands
