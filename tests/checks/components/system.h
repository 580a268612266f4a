// SPDX-License-Identifier: BSL-1.0
/// What broken libraries do with the operating system: one source for each system.
#pragma once

namespace Mz::Test {

/// Takes a reference to the library that contains this code, so that it stays loaded.
bool holdThisLibrary();

/// Opens a file, or a handle, and forgets it.
bool leaveFileOpen();

/// Starts a thread that waits in a function of the system until the process ends.
bool leaveThreadRunning();

/// Returns whether this process has standard input.
bool hasStandardInput();

} // namespace Mz::Test
