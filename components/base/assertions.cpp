// SPDX-License-Identifier: BSL-1.0
/// Throws the exception that aborts the current work.
///
/// The exception is a normal C++ exception, not a call of `std::abort`: the stack unwinds, and the
/// code that started the work decides what follows. Its functions are defined here, not inline, so
/// that its type information has one home and every library can catch it.
#include "components/base/assertions.h"

#include <new>

namespace Mz {

Assertions::ExProgramAborted::ExProgramAborted(const char* file, int line)
    : std::runtime_error(""), ExBase(file, line) {
    setReason("Program aborted.");
}

Assertions::ExProgramAborted::ExProgramAborted(const ExProgramAborted& other) = default;
Assertions::ExProgramAborted::~ExProgramAborted() = default;

const char* Assertions::ExProgramAborted::what() const noexcept {
    return getReason();
}

ExBase* Assertions::ExProgramAborted::clone() const {
    try {
        return new ExProgramAborted(*this);
    } catch (const std::bad_alloc&) {
        return nullptr;
    }
}

void Assertions::throwProgramAborted(const char* file, int line) {
    throw ExProgramAborted(file, line);
}

} // namespace Mz
