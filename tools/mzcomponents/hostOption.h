// SPDX-License-Identifier: BSL-1.0
/// The option --host of the commands that examine libraries.
#pragma once

#include <filesystem>
#include <string>
#include <vector>

namespace CLI {
class App;
}

namespace Mz::Commands {

/// Programs and libraries of the host, with which the interfaces of components are compared.
struct HostFiles {
    std::vector<std::string> files; ///< as in the arguments

    /// Returns the files. Reports each that describes no interface.
    std::vector<std::filesystem::path> paths() const;
};

/// Adds the option to a command.
/// \param host  receives the files, and must outlive the parser
void addHostOption(CLI::App& command, HostFiles& host);

} // namespace Mz::Commands
