// SPDX-License-Identifier: BSL-1.0
/// A medium that fails or throws from a chosen call on.
#pragma once

#include <ios>
#include <streambuf>
#include <string>

namespace Mz::Test {

enum class Fault { None, Fails, Throws };

/// What a broken medium throws: a type that the standard library does not know.
struct MediumFailure {};

/// Reads from and appends to a text. Counts the virtual calls; the `at`-th (from 1) and all later
/// ones fail or throw.
class FaultyBuffer : public std::streambuf {
  public:
    FaultyBuffer(std::string text, Fault fault, int at)
        : text(std::move(text)), fault(fault), at(at) {}

    const std::string& content() const { return text; }
    bool wentWrong() const { return fault != Fault::None && callCount >= at; }

  protected:
    int_type underflow() override {
        if (goesWrong() || position >= text.size())
            return traits_type::eof();
        return traits_type::to_int_type(text[position]);
    }
    int_type uflow() override {
        if (goesWrong() || position >= text.size())
            return traits_type::eof();
        return traits_type::to_int_type(text[position++]);
    }
    int_type pbackfail(int_type byte) override {
        if (goesWrong() || position == 0)
            return traits_type::eof();
        --position;
        if (!traits_type::eq_int_type(byte, traits_type::eof()))
            text[position] = traits_type::to_char_type(byte);
        return traits_type::not_eof(byte);
    }
    std::streamsize xsgetn(char* into, std::streamsize size) override {
        if (goesWrong())
            return 0;
        const std::size_t length = text.copy(into, static_cast<std::size_t>(size), position);
        position += length;
        return static_cast<std::streamsize>(length);
    }
    int_type overflow(int_type byte) override {
        if (goesWrong())
            return traits_type::eof();
        text += traits_type::to_char_type(byte);
        return traits_type::not_eof(byte);
    }
    std::streamsize xsputn(const char* from, std::streamsize size) override {
        if (goesWrong())
            return 0;
        text.append(from, static_cast<std::size_t>(size));
        return size;
    }
    pos_type seekoff(off_type offset, std::ios::seekdir direction, std::ios::openmode) override {
        if (goesWrong())
            return pos_type(off_type(-1));
        const auto end = static_cast<off_type>(text.size());
        const off_type base = direction == std::ios::beg   ? 0
                              : direction == std::ios::end ? end
                                                           : static_cast<off_type>(position);
        if (base + offset < 0 || base + offset > end)
            return pos_type(off_type(-1));
        position = static_cast<std::size_t>(base + offset);
        return pos_type(base + offset);
    }

  private:
    bool goesWrong() {
        if (fault == Fault::None || ++callCount < at)
            return false;
        if (fault == Fault::Throws)
            throw MediumFailure();
        return true;
    }

    std::string text;
    std::size_t position = 0;
    Fault fault;
    int at;
    int callCount = 0;
};

} // namespace Mz::Test
