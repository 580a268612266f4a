// SPDX-License-Identifier: BSL-1.0
/// What tells the loader that two library files are different, for each system in its own folder.
#pragma once

#include <string>

namespace Mz::Benchmarks {

/// Writes a number into a library, so that it looks to the loader as if it was linked at another
/// time. A no-op if the system's libraries have no such number.
void setStamp(std::string& library, unsigned int number);

} // namespace Mz::Benchmarks
