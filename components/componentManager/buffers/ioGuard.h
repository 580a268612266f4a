/// Calls into standard streams of which only the stream's flags tell the outcome.
///
/// Before and after each operation a standard stream does more than the operation: it flushes the
/// stream that it is tied to, flushes itself under `unitbuf`, and throws what its exception mask
/// demands. Some of that happens in a destructor, where an exception ends the process; and an
/// exception of the tied stream keeps the operation from being done. So mask, tie and `unitbuf` are
/// taken off for the length of one operation, and the flushes are made here, at the same moments
/// and by the same calls of the buffers.
#pragma once

#include <cxxabi.h>
#include <exception>
#include <istream>
#include <ostream>

namespace Mz {

/// Runs `work`, drops what it throws, and returns whether it threw nothing. The cancellation of a
/// thread is no exception of the stream's and passes through; it has no object, which a sanitizer
/// would complain about.
template <class Work>
__attribute__((no_sanitize("undefined"))) bool ignoringExceptions(Work&& work) {
    try {
        work();
        return true;
    } catch (abi::__forced_unwind&) {
        throw;
    } catch (...) {
        // The stream has set its flags before it threw.
        return false;
    }
}

/// Clears the end of input and the failure that comes with it; a broken medium stays broken.
inline void clearEndOfInput(std::ios& stream) {
    ignoringExceptions([&] { stream.clear(stream.rdstate() & std::ios::badbit); });
}

/// Takes mask, tie and `unitbuf` off a stream, and puts them back when it is destroyed.
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
        // Throws where a flag of the mask is set; the mask is back before that.
        ignoringExceptions([&] { stream.exceptions(mask); });
    }
    BareStream(const BareStream&) = delete;
    BareStream& operator=(const BareStream&) = delete;

    /// Whether there is nothing to take off.
    static bool is(const std::ios& stream) {
        return stream.exceptions() == std::ios::goodbit && !stream.tie() &&
               !(stream.flags() & std::ios::unitbuf);
    }

    std::ostream* tied() const { return tiedStream; }
    /// Whether the stream is to be flushed after an operation that ends now.
    bool isFlushDue() const { return flushesEach && std::uncaught_exceptions() == 0; }

  private:
    std::ios& stream;
    const std::ios::iostate mask;
    std::ostream* const tiedStream;
    const bool flushesEach;
};

/// Hands on what the buffer of a stream without a mask still holds.
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

/// Runs `work`, one operation of `out`, so that nothing but its flags tells how it went.
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

/// The same for one operation of `in`.
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

/// Flushes what `stream` is tied to, as is done before each operation of a stream in order. Whether
/// that succeeds concerns the tied stream alone.
inline void flushTied(const std::ios& stream, std::ostream* tied) {
    if (tied && tied->rdbuf() && stream.good())
        operate(*tied, [&] { tied->flush(); });
}

} // namespace Mz
