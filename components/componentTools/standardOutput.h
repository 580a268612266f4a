/// What a program has to see to before components run in it, when its results go to scripts.
#pragma once

#include "components/componentTools/export.h"

#include <streambuf>
#include <string>

namespace Mz::Tools {

/// Gives this process what it may have been started without: the user's locale, and word of how its
/// children end, which a program that ignores that passes on to those that it starts. Call it first
/// thing in `main`.
MZ_COMPONENT_TOOLS_API void prepareProgram();

/// Standard output, for one writer alone: from its creation on, up to the end of the process, what
/// anybody else writes there goes to standard error. Put a `std::ostream` on it; a `flush` that
/// leaves that one good means that everything has arrived.
///
/// There can be only one.
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
