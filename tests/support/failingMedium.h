// SPDX-License-Identifier: BSL-1.0
/// A medium that fails from a chosen call on.
#pragma once

#include <stdexcept>
#include <streambuf>
#include <string>
#include <utility>

namespace Mz::Test {

/// A medium without a buffer, so that each byte or block is one call. After `callsThatWork` calls,
/// every call throws or fails.
class FailingMedium final : public std::streambuf {
  public:
    FailingMedium(std::string input, int callsThatWork, bool throwing)
        : source(std::move(input)), remaining(callsThatWork), throws(throwing) {}

    std::string accepted;
    bool failed() const { return remaining < 0; }

  protected:
    int_type overflow(int_type c) override {
        if (fails())
            return traits_type::eof();
        accepted += traits_type::to_char_type(c);
        return c;
    }
    std::streamsize xsputn(const char* data, std::streamsize size) override {
        if (fails())
            return 0;
        accepted.append(data, static_cast<std::size_t>(size));
        return size;
    }
    int_type underflow() override { return take(0); }
    int_type uflow() override { return take(1); }
    int_type pbackfail(int_type) override {
        if (fails() || at == 0)
            return traits_type::eof();
        return traits_type::to_int_type(source[--at]);
    }

  private:
    int_type take(std::size_t step) {
        if (fails() || at >= source.size())
            return traits_type::eof();
        const int_type c = traits_type::to_int_type(source[at]);
        at += step;
        return c;
    }
    bool fails() {
        if (remaining > 0) {
            --remaining;
            return false;
        }
        remaining = -1;
        if (throws)
            throw std::runtime_error("medium");
        return true;
    }

    std::string source;
    std::size_t at = 0;
    int remaining;
    bool throws;
};

} // namespace Mz::Test
