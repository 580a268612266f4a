// SPDX-License-Identifier: BSL-1.0
/// The two ways of bytes between the library and the buffer of a standard stream, and media that
/// show a difference.
#pragma once

#include "tests/streams/support.h"

#include <array>
#include <fstream>
#include <ios>
#include <stdexcept>
#include <streambuf>
#include <string>
#include <vector>

namespace Mz::Test {

/// `Whole` is the way by the functions of the standard stream, with its guard. The library must go
/// it if the stream is tied.
enum class Way { Short, Whole };

inline void choose(std::ios& stream, Way way) {
    static std::ostream nothing(nullptr);
    if (way == Way::Whole)
        stream.tie(&nothing);
}

/// A foreign medium that records each call of its virtual functions. From the call `failsAt` on, it
/// fails or throws. It may have areas of a few bytes, which the standard functions use.
class RecordingBuffer final : public std::streambuf {
  public:
    explicit RecordingBuffer(std::string content = {}, bool hasAreas = false)
        : bytes(std::move(content)), areas(hasAreas) {}

    std::string bytes;
    std::vector<std::string> calls;
    std::size_t failsAt = static_cast<std::size_t>(-1);
    bool throws = false;
    std::ios* flushed = nullptr; ///< is set to `unitbuf` by the next write

    /// Moves the put area to `bytes`.
    void empty() {
        bytes.append(pbase(), static_cast<std::size_t>(pptr() - pbase()));
        setp(nullptr, nullptr);
    }

  protected:
    int_type overflow(int_type c) override {
        if (!begin("overflow"))
            return traits_type::eof();
        empty();
        bytes += traits_type::to_char_type(c);
        if (areas)
            setp(output.data(), output.data() + output.size());
        return traits_type::not_eof(c);
    }
    std::streamsize xsputn(const char* data, std::streamsize size) override {
        if (!begin("xsputn " + std::to_string(size)))
            return 0;
        if (flushed)
            flushed->setf(std::ios::unitbuf);
        empty();
        bytes.append(data, static_cast<std::size_t>(size));
        if (areas)
            setp(output.data(), output.data() + output.size());
        return size;
    }
    std::streamsize xsgetn(char* data, std::streamsize size) override {
        if (!begin("xsgetn " + std::to_string(size)))
            return 0;
        at -= static_cast<std::size_t>(egptr() - gptr());
        setg(nullptr, nullptr, nullptr);
        const std::size_t got = bytes.copy(data, static_cast<std::size_t>(size), at);
        at += got;
        return static_cast<std::streamsize>(got);
    }
    int_type underflow() override {
        if (!areas)
            return take("underflow", 0);
        if (!begin("underflow") || at >= bytes.size())
            return traits_type::eof();
        const std::size_t got = bytes.copy(input.data(), input.size(), at);
        at += got;
        setg(input.data(), input.data(), input.data() + got);
        return traits_type::to_int_type(input[0]);
    }
    int_type uflow() override { return areas ? std::streambuf::uflow() : take("uflow", 1); }
    int_type pbackfail(int_type c) override {
        if (!begin("pbackfail"))
            return traits_type::eof();
        at -= static_cast<std::size_t>(egptr() - gptr());
        setg(nullptr, nullptr, nullptr);
        if (at == 0)
            return traits_type::eof();
        bytes[--at] = traits_type::to_char_type(c);
        return c;
    }
    int sync() override { return begin("sync") ? 0 : -1; }
    pos_type seekoff(off_type, std::ios::seekdir, std::ios::openmode) override {
        return begin("seekoff") ? pos_type(static_cast<off_type>(at)) : pos_type(off_type(-1));
    }

  private:
    bool begin(const std::string& call) {
        calls.push_back(call);
        if (calls.size() <= failsAt)
            return true;
        if (throws)
            throw std::runtime_error("medium");
        return false;
    }
    int_type take(const char* call, std::size_t step) {
        if (!begin(call) || at >= bytes.size())
            return traits_type::eof();
        const int_type c = traits_type::to_int_type(bytes[at]);
        at += step;
        return c;
    }

    const bool areas;
    std::array<char, 50> output{};
    std::array<char, 50> input{};
    std::size_t at = 0; ///< the position after the get area
};

/// Returns what happened as text: the exception of `work`, if any, then the state of the stream. If
/// it is bad, failbit does not count: it shows in how many pieces the output was when it failed.
template <class Work>
std::string outcome(std::ios& stream, Work&& work) {
    std::string told;
    try {
        told = work();
    } catch (const QrStreamEx::ExReadError&) {
        told = "ExReadError";
    } catch (const QrStreamEx::ExWriteError&) {
        told = "ExWriteError";
    }
    return told + "|" + (stream.bad() ? "bad" : std::to_string(stream.rdstate())) + "|" +
           std::to_string(stream.exceptions());
}

} // namespace Mz::Test
