// SPDX-License-Identifier: BSL-1.0
// Reads bytes and characters from an input buffer by its own operations, in several locales. What
// it takes is compared with what the C library reads in the same bytes, and with other kinds of
// buffer.
//
// Input: the locale, the number of steps, the steps, each an operation and its argument, the
// content.
#include "components/componentManager/bufferio.h"
#include "components/objectIO/objectIO.h"
#include "fuzz/fuzz.h"
#include "fuzz/locales.h"
#include "tests/streams/streamKinds.h"

#include <algorithm>
#include <array>
#include <cwchar>
#include <iterator>
#include <optional>
#include <sstream>

namespace {

using namespace Mz;

/// An IO that forwards everything, and no IO of the library.
class Forwarding final : public QrCastImpl<Forwarding, QrForwardingIO, const Forwarding&> {
  public:
    explicit Forwarding(QrCastable* io) : QrCastImpl(io) {}
};

constexpr int room = 24;
/// A sequence of this many bytes that is not a character is an error.
constexpr std::size_t longestSequence = 4;

template <class Unit>
std::string told(int count, const Unit* units) {
    const std::size_t length = count > 0 ? static_cast<std::size_t>(count) * sizeof(Unit) : 0;
    return std::to_string(count) + ":" + std::string(reinterpret_cast<const char*>(units), length);
}

/// What can be read: the buffer, and its bytes from its position.
struct Medium {
    explicit Medium(std::stringbuf& buffer) : buffer(buffer), rest(unread()) {}

    std::string unread() const {
        const auto at = buffer.pubseekoff(0, std::ios::cur, std::ios::in);
        return buffer.str().substr(static_cast<std::size_t>(at));
    }
    /// Expects that just this many bytes were taken.
    void expectTaken(std::size_t count) const {
        Fuzz::expectSame(unread(), rest.substr(std::min(count, rest.size())),
                         "what was read is taken, and nothing more");
    }

    std::stringbuf& buffer;
    std::string rest; ///< the bytes when this was made
};

/// Returns the length of the character at the beginning of `bytes`, 0 for a NUL, -1 if there is
/// none.
int lengthOf(std::string_view bytes, bool plain, wchar_t& character) {
    if (bytes.empty())
        return -1;
    character = static_cast<unsigned char>(bytes[0]);
    if (plain)
        return character != L'\0';
    std::mbstate_t state{};
    const std::size_t length =
        std::mbrtowc(&character, bytes.data(), std::min(bytes.size(), longestSequence), &state);
    return length <= longestSequence ? static_cast<int>(length) : -1;
}

/// The characters that the C library reads.
struct Reading {
    std::wstring characters;
    std::size_t bytes = 0;
    bool nul = false;    ///< a NUL ended it
    bool faulty = false; ///< a sequence that is no character did
};

/// Reads at most `count` characters of at most `size` bytes.
Reading readByTheSystem(std::string_view rest, bool plain, std::size_t size, int count) {
    Reading reading;
    rest = rest.substr(0, size);
    while (reading.bytes < rest.size() &&
           reading.characters.size() != static_cast<std::size_t>(count)) {
        wchar_t character = L'\0';
        const int length = lengthOf(rest.substr(reading.bytes), plain, character);
        reading.nul = length == 0;
        reading.faulty = length < 0 && rest.size() - reading.bytes >= longestSequence;
        if (length <= 0)
            break;
        reading.characters += character;
        reading.bytes += static_cast<std::size_t>(length);
    }
    return reading;
}

/// Reads text as the step says. With `medium`, expects that it is what the C library reads.
class TextStep {
  public:
    TextStep(QrBufferedIO& io, const Medium* medium, bool plain, unsigned int argument)
        : io(io), medium(medium), plain(plain), size(static_cast<int>(argument & 15)),
          count(static_cast<int>(argument >> 4) - 1) {}

    std::string wide() {
        std::array<wchar_t, room> text{};
        const int wanted = std::min(size, count);
        const int got = io.readChar(text.data(), size, count);
        if (medium) {
            Reading reading =
                readByTheSystem(medium->rest, plain, medium->rest.size(), std::max(wanted, 0));
            Fuzz::expect(!reading.faulty, "what is no character is refused");
            if (reading.nul) // It counts for the rest of the request.
                reading.characters.resize(static_cast<std::size_t>(wanted));
            Fuzz::expect(std::wstring(text.data(), static_cast<std::size_t>(got)) ==
                             reading.characters,
                         "the characters are those of the C library");
            medium->expectTaken(reading.bytes);
        }
        return told(got, text.data());
    }

    std::string narrow() {
        std::array<char, room> text{};
        const int got = io.readChar(text.data(), size, count);
        if (medium) {
            const Reading reading =
                readByTheSystem(medium->rest, plain, static_cast<std::size_t>(size), count);
            Fuzz::expect(!reading.faulty, "what is no character is refused");
            Fuzz::expectSame(std::string(text.data(), static_cast<std::size_t>(got)),
                             medium->rest.substr(0, reading.bytes),
                             "the bytes are those of the characters");
            medium->expectTaken(reading.bytes);
        }
        return told(got, text.data());
    }

  private:
    QrBufferedIO& io;
    const Medium* medium;
    bool plain;
    int size, count;
};

std::size_t spaceIn(std::string_view bytes, int count) {
    std::size_t at = 0;
    for (; count > 0 && at < bytes.size(); --count) {
        if (std::string_view(" \t\n\v\f\r").find(bytes[at]) == std::string_view::npos)
            break;
        if (bytes[at++] != '\r')
            continue;
        if (at == bytes.size() || bytes[at] != '\n')
            break;
        ++at;
    }
    return at;
}

std::string skip(QrBufferedIO& io, const Medium* medium, int count) {
    io.skipWhiteSpace(count);
    if (medium)
        medium->expectTaken(spaceIn(medium->rest, count));
    return {};
}

std::string readOne(QrBufferedIO& io, bool wide) {
    wchar_t character = L'\0';
    char byte = '\0';
    return wide ? told(io.readChar(character), &character) : told(io.readChar(byte), &byte);
}

std::string putBack(QrBufferedIO& io, unsigned int argument, bool wide) {
    // Wide characters of all sizes.
    if (wide)
        io.ungetc(static_cast<wchar_t>(argument * (argument + 1)));
    else
        io.ungetc(static_cast<char>(argument));
    return {};
}

std::string move(QrBufferedIO& io, unsigned int argument) {
    const int origin = static_cast<int>(argument & 3);
    const auto offset = static_cast<int64>(argument >> 2);
    return std::to_string(io.seek(origin ? offset - 32 : offset, origin));
}

/// What an IO reads, and how. Only what reads a buffer of strings directly is compared with the C
/// library.
struct Reader {
    QrBufferedIO& io;
    std::istream& stream;
    std::stringbuf* compared = nullptr;
    bool plain = false;

    std::string operate(unsigned int operation, unsigned int argument) const {
        // At the end of input a stream takes and puts back nothing until it is cleared.
        std::optional<Medium> medium;
        if (compared && stream.good())
            medium.emplace(*compared);
        const Medium* const before = medium ? &*medium : nullptr;
        std::array<char, room> bytes{};
        switch (operation % 10) {
        case 0: return TextStep(io, before, plain, argument).wide();
        case 1: return TextStep(io, before, plain, argument).narrow();
        case 2: return readOne(io, true);
        case 3: return readOne(io, false);
        case 4: return std::to_string(io.read());
        case 5: return told(io.read(bytes.data(), static_cast<int>(argument % room)), bytes.data());
        case 6: return skip(io, before, static_cast<int>(argument % 8));
        case 7: return putBack(io, argument, operation & 0x10);
        case 8: return move(io, argument);
        default: return std::to_string(io.tell()) + std::to_string(io.canSeek());
        }
    }

    /// Returns the results of all steps, the state of the stream, and the bytes that were not read.
    std::string outcomeOf(std::string_view steps) const {
        std::string result;
        for (std::size_t at = 0; at + 1 < steps.size(); at += 2)
            result += Fuzz::outcomeOf([&] {
                          return operate(static_cast<unsigned char>(steps[at]),
                                         static_cast<unsigned char>(steps[at + 1]));
                      }) +
                      "; ";
        result += std::to_string(stream.rdstate()) + "|";
        return result + std::string(std::istreambuf_iterator<char>(stream.rdbuf()), {});
    }
};

std::string comparedReading(std::string_view content, std::string_view steps, bool plain) {
    std::stringbuf buffer(std::string(content), std::ios::in | std::ios::out);
    std::istream source(&buffer);
    QrInBuffer io(&source);
    return Reader{io, source, &buffer, plain}.outcomeOf(steps);
}

template <class Buffer, class IO>
std::string readingBy(std::string_view content, std::string_view steps) {
    Buffer buffer(std::string(content), std::ios::in | std::ios::out);
    std::istream source(&buffer);
    IO io(&source);
    return Reader{io, source}.outcomeOf(steps);
}

template <class Outer>
std::string forwardedBy(std::string_view content, std::string_view steps) {
    std::stringbuf buffer(std::string(content), std::ios::in | std::ios::out);
    std::istream source(&buffer);
    QrInBuffer inner(&source);
    Outer io(&inner);
    return Reader{io, source}.outcomeOf(steps);
}

} // namespace

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    Fuzz::Input input(data, size);
    const unsigned int locale = input.byte();
    Fuzz::chooseLocale(locale);
    const std::string_view steps = input.take(input.byte() % 64);
    const std::string_view content = input.rest();
    const bool plain = locale % Fuzz::localeNames().size() == 0;
    const std::string direct = comparedReading(content, steps, plain);
    Fuzz::expectSame(direct, readingBy<std::stringbuf, QrInBuffer>(content, steps),
                     "looking at the buffer changes nothing");
    Fuzz::expectSame(direct, readingBy<Test::WatchedBuffer, QrInBuffer>(content, steps),
                     "a watched buffer gives the same");
    Fuzz::expectSame(direct, readingBy<std::stringbuf, Test::ForeignInput>(content, steps),
                     "a foreign IO gives the same");
    Fuzz::expectSame(direct, forwardedBy<QrObjectInBuffer>(content, steps),
                     "the IO of objects gives the same");
    Fuzz::expectSame(direct, forwardedBy<Forwarding>(content, steps),
                     "an IO that forwards gives the same");
    return 0;
}
