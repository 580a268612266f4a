/// Ending the current work for good.
#pragma once

#include "components/base/exBase.h"

#include <stdexcept>

namespace Mz {

class Assertions {
  public:
    /// Thrown by `throwProgramAborted`. Its reason, which `what()` gives too, is "Program
    /// aborted.".
    class MZ_BASE_API ExProgramAborted : public std::runtime_error, public ExBase {
      public:
        ExProgramAborted(const char* file, int line);
        ExProgramAborted(const ExProgramAborted& other);
        ~ExProgramAborted() override;
        const char* what() const noexcept override;
        ExBase* clone() const override;
    };

    /// Throws `ExProgramAborted` with the source position given; never returns. May be called from
    /// any thread; whoever started the aborted work catches it.
    [[noreturn]] MZ_BASE_API static void throwProgramAborted(const char* file, int line);
};

} // namespace Mz
