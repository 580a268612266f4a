// SPDX-License-Identifier: BSL-1.0
/// The faults of libraries, as the child process reports them.
#pragma once

#include "components/componentTools/platform/system.h"
#include "components/componentTools/verdict.h"

#include <string>

namespace Mz::Tools {

/// Returns the finding for the current exception. `std::bad_alloc` becomes `outOfMemory`, which the
/// parent process checks against the memory that was really used. Call it in a `catch` block.
/// \param before  precedes the text of the exception
Finding exceptionFinding(Verdict verdict, const std::wstring& before = {});

/// The type of the functions that return the bytes of a message about a fault.
using FaultEncoder = std::string (*)(Verdict verdict, const std::wstring& subject,
                                     const std::wstring& words);

/// From now on, `abort` and `std::terminate` send a message and end this process.
/// \param pipe  must outlive all calls of them
void reportFatalFaults(System::AnswerPipe& pipe, FaultEncoder encode);

} // namespace Mz::Tools
