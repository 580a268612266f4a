// SPDX-License-Identifier: BSL-1.0
/// Captures the standard error stream.
#pragma once

#include <iostream>
#include <streambuf>
#include <string>

namespace Mz::Test {

/// Receives what is written to `std::cerr` while it lives. Clears unitbuf, so that only the flushes
/// of the tested code are counted.
class StandardErrorCapture : private std::streambuf {
  public:
    StandardErrorCapture() : previous(std::cerr.rdbuf(this)), flags(std::cerr.flags()) {
        std::cerr.unsetf(std::ios::unitbuf);
    }
    ~StandardErrorCapture() override {
        std::cerr.flags(flags);
        std::cerr.rdbuf(previous);
    }
    StandardErrorCapture(const StandardErrorCapture&) = delete;
    StandardErrorCapture& operator=(const StandardErrorCapture&) = delete;

    const std::string& text() const { return written; }
    int flushes() const { return flushCount; }

  private:
    int_type overflow(int_type byte) override {
        if (!traits_type::eq_int_type(byte, traits_type::eof()))
            written += traits_type::to_char_type(byte);
        return traits_type::not_eof(byte);
    }
    int sync() override {
        ++flushCount;
        return 0;
    }

    std::streambuf* previous;
    std::ios::fmtflags flags;
    std::string written;
    int flushCount = 0;
};

} // namespace Mz::Test
