// SPDX-License-Identifier: BSL-1.0
/// The work of the child process of a check.
#pragma once

#include "components/componentTools/checking/checkMessages.h"

#include <string>
#include <vector>

namespace Mz::Tools {

/// The first argument of `mzcomponents-probe` for a check. After it come the memory limit that the
/// system enforces, the task, the library and the samples.
inline constexpr const char* checkArgument = "--check";

/// Carries out a task in this process.
void carryOut(const CheckTask& task, CheckSender& sender);

/// Runs as the child process. Sends its messages to standard output.
/// \param arguments  those of the process, without the program's name
/// \return the exit status for invalid arguments; ends the process otherwise
int runCheckChild(const std::vector<std::string>& arguments);

} // namespace Mz::Tools
