// SPDX-License-Identifier: BSL-1.0
/// The command `uid`: its options, and how it runs.
#pragma once

#include <functional>
#include <string>

namespace CLI {
class App;
}

namespace Mz::Commands {

/// The options of `uid`.
struct UidArguments {
    std::string count = "1";
    bool words = false;
};

/// Adds the command to the parser.
/// \param arguments  receives the options, and must outlive the parser
/// \param command    receives the command to run
void addUidCommand(CLI::App& app, UidArguments& arguments, std::function<int()>& command);

/// Writes new uids, one on a line.
int uid(const UidArguments& arguments);

} // namespace Mz::Commands
