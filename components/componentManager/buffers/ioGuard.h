// SPDX-License-Identifier: BSL-1.0
/// Operations on standard streams whose result is only in the stream's flags.
///
/// Around each operation a standard stream flushes the stream that it is tied to, flushes itself
/// under `unitbuf`, and throws the exceptions of its mask. Some of this happens in a destructor,
/// where an exception terminates the process, and an exception of the tied stream prevents the
/// operation. So mask, tie and `unitbuf` are removed for one operation, and the flushes are made
/// here, at the same moments and by the same calls of the buffers.
#pragma once

#include <cxxabi.h>
#include <exception>
#include <istream>
#include <ostream>

namespace Mz {

/// Runs `work`, discards its exceptions, and returns whether there was none. The cancellation of a
/// thread is not an exception of the stream and passes through. That one has no object, which a
/// sanitizer would report.
template <class Work>
__attribute__((no_sanitize("undefined"))) bool ignoringExceptions(Work&& work) {
    try {
        work();
        return true;
    } catch (abi::__forced_unwind&) {
        throw;
    } catch (...) {
        // The stream set its flags before it threw.
        return false;
    }
}

/// Clears eofbit and failbit. Keeps badbit: a medium that failed remains so.
inline void clearEndOfInput(std::ios& stream) {
    ignoringExceptions([&] { stream.clear(stream.rdstate() & std::ios::badbit); });
}

/// Scope in which a stream has no mask, tie or `unitbuf`. The destructor restores them.
class BareStream {
  public:
    explicit BareStream(std::ios& stream)
        : stream(stream), mask(stream.exceptions()), tiedStream(stream.tie(nullptr)),
          flushesEach((stream.flags() & std::ios::unitbuf) != 0) {
        stream.unsetf(std::ios::unitbuf);
        stream.exceptions(std::ios::goodbit);
    }
    ~BareStream() {
        if (flushesEach)
            stream.setf(std::ios::unitbuf);
        stream.tie(tiedStream);
        // Throws if a flag of the mask is set, after it has restored the mask.
        ignoringExceptions([&] { stream.exceptions(mask); });
    }
    BareStream(const BareStream&) = delete;
    BareStream& operator=(const BareStream&) = delete;

    /// Returns whether the stream has none of them.
    static bool is(const std::ios& stream) {
        return stream.exceptions() == std::ios::goodbit && !stream.tie() &&
               !(stream.flags() & std::ios::unitbuf);
    }

    std::ostream* tied() const { return tiedStream; }
    /// Returns whether an operation that ends now must flush the stream.
    bool isFlushDue() const { return flushesEach && std::uncaught_exceptions() == 0; }

  private:
    std::ios& stream;
    const std::ios::iostate mask;
    std::ostream* const tiedStream;
    const bool flushesEach;
};

/// Flushes the buffer of a stream without a mask. Sets badbit if that fails.
__attribute__((no_sanitize("undefined"))) inline void synchronise(std::ostream& out) {
    bool succeeded = false;
    try {
        succeeded = !out.rdbuf() || out.rdbuf()->pubsync() != -1;
    } catch (abi::__forced_unwind&) {
        out.setstate(std::ios::badbit);
        throw;
    } catch (...) {
        // A buffer that throws has failed.
    }
    if (!succeeded)
        out.setstate(std::ios::badbit);
}

void flushTied(const std::ios& stream, std::ostream* tied);

/// Runs `work`, one operation of `out`, so that its result is only in the stream's flags.
template <class Work>
void operate(std::ostream& out, Work&& work) {
    if (BareStream::is(out)) {
        ignoringExceptions(work);
        return;
    }
    const BareStream bare(out);
    flushTied(out, bare.tied());
    if (ignoringExceptions(work) && bare.isFlushDue())
        synchronise(out);
}

/// Runs `work`, one operation of `in`, in the same way.
template <class Work>
void operate(std::istream& in, Work&& work) {
    if (BareStream::is(in)) {
        ignoringExceptions(work);
        return;
    }
    const BareStream bare(in);
    flushTied(in, bare.tied());
    ignoringExceptions(work);
}

/// Flushes `tied`, the stream to which `stream` is tied, as before each operation of a stream in a
/// good state. Only the tied stream records a failure.
inline void flushTied(const std::ios& stream, std::ostream* tied) {
    if (tied && tied->rdbuf() && stream.good())
        operate(*tied, [&] { tied->flush(); });
}

} // namespace Mz
