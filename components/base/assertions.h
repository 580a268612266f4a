// SPDX-License-Identifier: BSL-1.0
/// The abort of the current work by an exception.
#pragma once

#include "components/base/exBase.h"

#include <stdexcept>

namespace Mz {

/// Scope of the function that aborts the current work, and of its exception.
class Assertions {
  public:
    /// The exception of `throwProgramAborted`. The reason is "Program aborted.", which `what()`
    /// returns too. `clone()` returns null if memory runs out.
    class MZ_BASE_API ExProgramAborted : public std::runtime_error, public ExBase {
      public:
        ExProgramAborted(const char* file, int line);
        ExProgramAborted(const ExProgramAborted& other);
        ~ExProgramAborted() override;
        const char* what() const noexcept override;
        ExBase* clone() const override;
    };

    /// Throws `ExProgramAborted`; never returns. The code that started the aborted work catches
    /// the exception. Thread-safe.
    ///
    /// \param file  source name of the form `components/<library>/<file>`; null counts as empty
    /// \param line  source line
    /// \throws ExProgramAborted  always
    [[noreturn]] MZ_BASE_API static void throwProgramAborted(const char* file, int line);
};

} // namespace Mz
