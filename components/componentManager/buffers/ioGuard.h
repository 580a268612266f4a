/// Calls into standard streams whose exceptions are not wanted.
#pragma once

#include <cxxabi.h>
#include <ios>

namespace Mz {

/// Runs `work` and drops what it throws: a stream with an exception mask throws where another one
/// only sets its flags, and the flags are what decides here. The cancellation of a thread is no
/// exception of the stream's and passes through.
template <class Work>
void ignoringExceptions(Work&& work) {
    try {
        work();
    } catch (abi::__forced_unwind&) {
        throw;
    } catch (...) {
        // The stream has set its flags before it threw.
    }
}

/// Clears the end of input and the failure that comes with it; a broken medium stays broken.
inline void clearEndOfInput(std::ios& stream) {
    ignoringExceptions([&] { stream.clear(stream.rdstate() & std::ios::badbit); });
}

} // namespace Mz
