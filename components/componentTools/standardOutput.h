// SPDX-License-Identifier: BSL-1.0
/// Protects the standard output of a program from the components that run in it.
#pragma once

#include "components/componentTools/export.h"

#include <streambuf>
#include <string>

namespace Mz::Tools {

/// Sets the user's locale, and resets SIGCHLD to its default, so that the exit status of child
/// processes is available. A parent process that ignores SIGCHLD passes this on to its children.
/// Call it first in `main`. On Windows it sets the locale only.
MZ_COMPONENT_TOOLS_API void prepareProgram();

/// A stream buffer with exclusive access to standard output.
///
/// From its construction until the end of the process, output that other code writes to standard
/// output goes to standard error. Create a `std::ostream` with this buffer. If the stream is good
/// after `flush`, everything was written. The destructor flushes, and ignores a failure.
///
/// Only one object may be created in a process.
class MZ_COMPONENT_TOOLS_API ReservedOutput final : public std::streambuf {
  public:
    ReservedOutput();
    ~ReservedOutput() override;
    ReservedOutput(const ReservedOutput&) = delete;
    ReservedOutput& operator=(const ReservedOutput&) = delete;

  protected:
    int_type overflow(int_type character) override;
    std::streamsize xsputn(const char* data, std::streamsize count) override;
    int sync() override;

  private:
    int descriptor;
    std::string waiting;
};

} // namespace Mz::Tools
