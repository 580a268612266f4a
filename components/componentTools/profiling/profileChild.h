// SPDX-License-Identifier: BSL-1.0
/// The work of the child processes of a profile.
#pragma once

#include <string>
#include <vector>

namespace Mz::Tools {

/// The first argument of `mzcomponents-probe` for a profile. After it come the memory limit that
/// the system enforces, the task, the recorded list (may be empty) and the folders.
inline constexpr const char* profileArgument = "--profile";

/// Runs as the child process. Sends its messages to standard output.
/// \param arguments  those of the process, without the program's name
/// \return the exit status for invalid arguments; ends the process otherwise
int runProfileChild(const std::vector<std::string>& arguments);

} // namespace Mz::Tools
