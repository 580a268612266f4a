// SPDX-License-Identifier: BSL-1.0
/// What a hostile importer does with the operating system: one source for each system.
#pragma once

namespace Mz::Test {

/// Closes every file, pipe and handle of this process.
void closeEverything();

/// Ends this process at once from outside of its code.
void killSelf();

/// Stops this process without ending it.
void freeze();

// Each returns whether the system allowed it.
bool openConnection();
bool startProcess();
bool endParent();
bool changeOwnFile();

} // namespace Mz::Test
