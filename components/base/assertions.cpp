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
