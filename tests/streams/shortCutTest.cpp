// SPDX-License-Identifier: BSL-1.0
// Tests that the library's short cuts past a standard stream to its buffer give the same results as
// the calls of that stream.
#include "tests/streams/support.h"
#include "tests/support/temporaryDirectory.h"

#include <gtest/gtest.h>

#include <array>
#include <bit>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <limits>
#include <random>
#include <vector>

namespace {

using namespace Mz::Test;
using Mz::int64;
using Mz::QrBinaryStream;
using Mz::QrStream;
using Mz::QrTextStream;

/// An output class from outside the library, for which it takes no short cut.
class ForeignOutput final : public Mz::QrOutBuffer {
  public:
    using Mz::QrOutBuffer::QrOutBuffer;
};

template <class Buffer, class IO, class Stream>
struct Output {
    Buffer buffer{std::ios::in | std::ios::out};
    std::ostream sink{&buffer};
    IO io{&sink};
    Stream stream{&io};

    std::string outcome() const { return buffer.str() + "|" + std::to_string(sink.rdstate()); }
};

template <class Buffer, class IO, class Stream>
struct Input {
    explicit Input(const std::string& content) : buffer(content, std::ios::in | std::ios::out) {}

    Buffer buffer;
    std::istream source{&buffer};
    IO io{&source};
    Stream stream{&io};
};

/// Runs `work` on a stream over each kind of output and expects equal results.
template <class Stream, class Work>
void expectSameOutput(const Work& work) {
    Output<std::stringbuf, Mz::QrOutBuffer, Stream> direct;
    Output<WatchedBuffer, Mz::QrOutBuffer, Stream> watched;
    Output<std::stringbuf, ForeignOutput, Stream> foreign;
    const std::string expected = work(direct.stream) + direct.outcome();
    EXPECT_EQ(expected, work(watched.stream) + watched.outcome());
    EXPECT_EQ(expected, work(foreign.stream) + foreign.outcome());
}

/// The same for input. Compares the result of `work`, the unread bytes and the stream's state.
template <class Stream, class Work>
void expectSameInput(const std::string& content, const Work& work) {
    Input<std::stringbuf, Mz::QrInBuffer, Stream> direct(content);
    Input<WatchedBuffer, Mz::QrInBuffer, Stream> watched(content);
    Input<std::stringbuf, ForeignInput, Stream> foreign(content);
    const auto outcome = [&](auto& input) {
        const std::string told = work(input.stream);
        const std::string state = std::to_string(input.source.rdstate());
        return told + "|" + state + "|" +
               std::string(std::istreambuf_iterator<char>(&input.buffer), {});
    };
    const std::string expected = outcome(direct);
    EXPECT_EQ(expected, outcome(watched)) << "from " << toHex(content);
    EXPECT_EQ(expected, outcome(foreign)) << "from " << toHex(content);
}

template <class T>
std::vector<T> valuesOf(unsigned int seed, std::size_t count) {
    std::mt19937_64 engine(seed);
    std::vector<T> values(count);
    for (T& value : values) {
        // Values of every length.
        const std::uint64_t bits = engine() >> (engine() % 64);
        std::memcpy(&value, &bits, sizeof value);
    }
    return values;
}

template <class Stream>
std::string writeMixed(QrStream& stream) {
    constexpr std::size_t count = 400;
    std::mt19937 engine(7);
    const auto ints = valuesOf<int>(1, count);
    const auto longs = valuesOf<int64>(2, count);
    const auto reals = valuesOf<double>(3, count);
    const auto singles = valuesOf<float>(4, count);
    const auto shorts = valuesOf<short>(5, count);
    const auto bytes = valuesOf<unsigned char>(6, count);
    for (std::size_t index = 0; index < count; ++index)
        switch (engine() % 12) {
        case 0: stream << ints[index]; break;
        case 1: stream << longs[index]; break;
        case 2: stream << reals[index]; break;
        case 3: stream << singles[index]; break;
        case 4: stream << shorts[index]; break;
        case 5: stream << bytes[index]; break;
        case 6: stream << static_cast<unsigned int>(ints[index]); break;
        case 7: stream << static_cast<unsigned long long>(longs[index]); break;
        case 8: stream << static_cast<long>(ints[index]); break;
        case 9: stream << (bytes[index] % 2 == 0); break;
        case 10: stream << std::wstring(bytes[index], L'x'); break;
        default: stream.write(ints[0], 300); break;
        }
    return {};
}

TEST(ShortCuts, WriteTextAsTheWholeWayDoes) {
    expectSameOutput<QrTextStream>([](QrStream& s) { return writeMixed<QrTextStream>(s); });
}

TEST(ShortCuts, WriteBinaryDataAsTheWholeWayDoes) {
    expectSameOutput<QrBinaryStream>([](QrStream& s) { return writeMixed<QrBinaryStream>(s); });
}

TEST(ShortCuts, CountTheColumnAsTheWholeWayDoes) {
    for (int first = 60; first < 75; ++first)
        expectSameOutput<BaseStream>([&](QrStream& stream) {
            stream << std::wstring(static_cast<std::size_t>(first), L'y') << 1 << 22 << 0.5 << true
                   << 333 << -4.25f << int64(1) << 'A';
            stream.write(7, 1);
            stream << 8 << 9;
            return std::string();
        });
}

/// Reads a value by `format` and returns the result and the value as text.
template <class T>
std::string readBy(QrStream& stream, const wchar_t* format) {
    T value{};
    std::memset(&value, 0x5A, sizeof value);
    const int assigned = stream.formattedRead(format, &value);
    return std::to_string(assigned) + toHex({reinterpret_cast<const char*>(&value), sizeof value});
}

std::string readByFormat(QrStream& stream, std::size_t which) {
    switch (which % 14) {
    case 0: return readBy<int>(stream, L"%d");
    case 1: return readBy<unsigned int>(stream, L"%u");
    case 2: return readBy<short>(stream, L"%hd");
    case 3: return readBy<unsigned short>(stream, L"%hu");
    case 4: return readBy<long>(stream, L"%ld");
    case 5: return readBy<unsigned long>(stream, L"%lu");
    case 6: return readBy<int64>(stream, L"%I64d");
    case 7: return readBy<unsigned long long>(stream, L"%I64u");
    case 8: return readBy<float>(stream, L"%g");
    case 9: return readBy<double>(stream, L"%lg");
    case 10: return readBy<int>(stream, L"%i");
    case 11: return readBy<int>(stream, L"%4d");
    case 12: return readBy<std::array<wchar_t, 64>>(stream, L"%60s");
    default: return readBy<std::array<char, 300>>(stream, L"%60[^,]");
    }
}

/// Returns random text that often looks like a number.
std::string randomText(std::mt19937& engine) {
    static const std::vector<std::string> pieces = {" ",
                                                    "\n",
                                                    "\t",
                                                    "-",
                                                    "+",
                                                    "0",
                                                    "7",
                                                    "42",
                                                    "123456789",
                                                    "4294967296",
                                                    "9223372036854775807",
                                                    "99999999999999999999",
                                                    ".",
                                                    "0.5",
                                                    "3.14159265358979",
                                                    "1e5",
                                                    "1e",
                                                    "1e+",
                                                    "2.5e-3",
                                                    "1e400",
                                                    "1e-400",
                                                    "-0",
                                                    "0x1F",
                                                    "x",
                                                    ",",
                                                    "abc",
                                                    "nan",
                                                    "inf",
                                                    std::string(1, '\0'),
                                                    "\x80",
                                                    "\xFF",
                                                    "1.7976931348623157e308",
                                                    "4.9e-324",
                                                    "9007199254740993",
                                                    "0.1234567890123456",
                                                    "179769313486231570000000000000000000000",
                                                    "\r\n",
                                                    "\v",
                                                    "00012"};
    std::string text;
    for (auto count = engine() % 12; count > 0; --count)
        text += pieces[engine() % pieces.size()];
    return text;
}

TEST(ShortCuts, ReadTextAsTheWholeWayDoes) {
    std::mt19937 engine(11);
    for (int round = 0; round < MZ_RANDOM_VALUES / 20 && !HasFailure(); ++round) {
        const std::string content = randomText(engine);
        const auto seed = engine();
        expectSameInput<BaseStream>(content, [&](QrStream& stream) {
            std::mt19937 formats(seed);
            std::string told;
            for (int count = 0; count < 6; ++count)
                told += readByFormat(stream, formats()) + ";";
            return told;
        });
    }
}

TEST(ShortCuts, ReadEveryEndOfTheBufferAsTheWholeWayDoes) {
    const std::string number = "  -123.4567e-2 77 1";
    for (std::size_t length = 0; length <= number.size(); ++length)
        for (std::size_t format = 0; format < 14; ++format)
            expectSameInput<BaseStream>(number.substr(0, length), [&](QrStream& stream) {
                return readByFormat(stream, format) + readByFormat(stream, format);
            });
}

TEST(ShortCuts, ReadAFileAcrossItsBlocks) {
    const TemporaryDirectory folder;
    const std::filesystem::path path = folder.path() / "numbers.txt";
    const auto ints = valuesOf<int>(21, 20'000);
    {
        std::ofstream file(path, std::ios::binary);
        Mz::QrOutBuffer io(&file);
        QrTextStream stream(&io);
        for (const int value : ints)
            stream << value << static_cast<double>(value) / 8;
    }
    std::ifstream file(path, std::ios::binary);
    Mz::QrInBuffer io(&file);
    QrTextStream stream(&io);
    int wrong = 0;
    for (std::size_t index = 0; index < ints.size(); ++index) {
        int value = 0;
        double real = 0;
        stream >> value >> real;
        wrong += value == ints[index] && real == static_cast<double>(value) / 8 ? 0 : 1;
        if (index % 7 == 0) // The next read returns what was put back.
            io.ungetc('8');
        if (index % 7 == 0)
            wrong += io.read() == '8' ? 0 : 1;
    }
    EXPECT_EQ(wrong, 0);
    EXPECT_EQ(io.read(), -1);
}

/// Reads by format and by character in turn, from a file with a buffer of `size` bytes; returns the
/// results.
template <class IO>
std::string readThroughBuffer(const std::filesystem::path& path, int size) {
    char memory[64];
    std::ifstream file;
    file.rdbuf()->pubsetbuf(size ? memory : nullptr, size);
    file.open(path, std::ios::binary);
    IO io(&file);
    BaseStream stream(&io);
    std::string told;
    for (std::size_t round = 0; round < 40; ++round) {
        told += readByFormat(stream, round) + ";";
        char character = '!';
        if (io.readChar(character) == 1)
            told += character;
    }
    return told;
}

TEST(ShortCuts, ReadAFileWhateverTheSizeOfItsBuffer) {
    const TemporaryDirectory folder;
    const std::filesystem::path path = folder.path() / "numbers.txt";
    std::mt19937 engine(31);
    for (int round = 0; round < 100 && !HasFailure(); ++round) {
        std::ofstream(path, std::ios::binary) << "x41-" << randomText(engine) << " 22 333 4444 5";
        for (const int size : {0, 1, 2, 3, 4, 8, 16, 64})
            EXPECT_EQ(readThroughBuffer<Mz::QrInBuffer>(path, size),
                      readThroughBuffer<ForeignInput>(path, size))
                << size;
    }
}

TEST(ShortCuts, ReadANumberThatBeginsWithWhatWasPutBack) {
    const TemporaryDirectory folder;
    const std::filesystem::path path = folder.path() / "number.txt";
    std::ofstream(path, std::ios::binary) << "x23 45 ";
    std::ifstream file(path, std::ios::binary);
    Mz::QrInBuffer io(&file);
    BaseStream stream(&io);
    EXPECT_EQ(io.read(), 'x');
    io.ungetc('1');
    int first = 0;
    int second = 0;
    stream >> first >> second;
    EXPECT_EQ(first, 123);
    EXPECT_EQ(second, 45);
}

TEST(ShortCuts, ReadBinaryDataAsTheWholeWayDoes) {
    const std::string bytes = "\x01\x02\x03\x04\x05\x06\x07\x08\x09\x0A\x0B";
    for (std::size_t length = 0; length <= bytes.size(); ++length)
        for (int count = 0; count < 4; ++count) {
            expectSameInput<QrBinaryStream>(bytes.substr(0, length), [&](QrStream& stream) {
                std::array<int, 4> values{-1, -1, -1, -1};
                const int got = stream.read(values[0], count);
                return std::to_string(got) +
                       toHex({reinterpret_cast<const char*>(values.data()), sizeof values});
            });
            expectSameInput<QrBinaryStream>(bytes.substr(0, length), [&](QrStream& stream) {
                std::array<wchar_t, 4> values{};
                const int got = stream.read(values[0], count);
                const int more = stream.read(values[3], 1);
                return std::to_string(got) + std::to_string(more);
            });
        }
}

TEST(ShortCuts, AreNotTakenPastATiedStreamOrAFlush) {
    std::stringbuf in("12 13 ", std::ios::in | std::ios::out);
    std::istream source(&in);
    std::ostringstream tied;
    class Counting final : public std::stringbuf {
      public:
        int syncs = 0;

      private:
        int sync() override { return ++syncs, 0; }
    } watched;
    std::ostream flushed(&watched);
    source.tie(&flushed);
    Mz::QrInBuffer io(&source);
    BaseStream stream(&io);
    int value = 0;
    stream >> value;
    EXPECT_EQ(value, 12);
    // A standard stream may skip the flush of a tied stream that has nothing to write. Write
    // something, so that the flush is required.
    flushed << "x";
    const int before = watched.syncs;
    stream >> value;
    EXPECT_EQ(value, 13);
    EXPECT_GT(watched.syncs, before);
}

TEST(ShortCuts, LeaveAStreamThatWasBrokenAlone) {
    std::ostringstream sink;
    Mz::QrOutBuffer io(&sink);
    BaseStream stream(&io);
    sink.setstate(std::ios::badbit);
    EXPECT_THROW(stream << 1, Mz::QrStreamEx::ExWriteError);
    EXPECT_EQ(sink.str(), "");
}

/// Formats as `%.16g` does. The width, which has no other effect, prevents the short cut.
std::string wholeWay(double value) {
    return written<BaseStream>([&](QrStream& s) { s.formattedWrite(L"%1.16g", value); });
}

std::string shortCut(double value) {
    return written<BaseStream>([&](QrStream& s) { s.formattedWrite(L"%.16g", value); });
}

TEST(ShortCuts, GiveADoubleTheDigitsOfTheWholeWay) {
    std::mt19937_64 engine(13);
    std::uniform_real_distribution<double> ordinary(-1000, 1000);
    int wrong = 0;
    const auto compare = [&](double value) {
        if (shortCut(value) == wholeWay(value))
            return;
        if (++wrong < 5)
            ADD_FAILURE() << shortCut(value) << " for " << wholeWay(value);
    };
    for (int round = 0; round < MZ_RANDOM_VALUES / 4; ++round) {
        compare(std::bit_cast<double>(engine()));
        compare(ordinary(engine));
        // Decimals with few digits, and the doubles next to them.
        const double few = static_cast<double>(static_cast<int>(engine() % 2'000'000) - 1'000'000) /
                           std::pow(10.0, static_cast<double>(engine() % 12));
        compare(few);
        compare(std::nextafter(few, 1e300));
        compare(std::nextafter(few, -1e300));
    }
    EXPECT_EQ(wrong, 0);
}

TEST(ShortCuts, GiveADoubleAtAnEdgeTheDigitsOfTheWholeWay) {
    const double smallest = std::numeric_limits<double>::denorm_min();
    for (int exponent = -1074; exponent < 1024; ++exponent) {
        const double power = std::ldexp(1.0, exponent);
        for (const double value : {power, std::nextafter(power, 0.0), power + power * 1e-16,
                                   std::nextafter(power, 1e308), 3 * power, -power})
            EXPECT_EQ(shortCut(value), wholeWay(value));
    }
    for (int exponent = -323; exponent <= 308; ++exponent) {
        const double power = std::strtod(("1e" + std::to_string(exponent)).c_str(), nullptr);
        for (const double value : {power, std::nextafter(power, 0.0), std::nextafter(power, 1e308),
                                   5 * power, 9.999999999999999 * power})
            EXPECT_EQ(shortCut(value), wholeWay(value));
    }
    for (const double value :
         {0.0, -0.0, smallest, -smallest, 1e15, 1e16, 1e17, 999999999999999.9, 9999999999999998.0,
          123456789012345.6, 0.0001, 0.00001, 1e22, 1e23, std::numeric_limits<double>::infinity(),
          -std::numeric_limits<double>::infinity(), std::numeric_limits<double>::quiet_NaN()})
        EXPECT_EQ(shortCut(value), wholeWay(value));
}

/// Reads a `double` by both ways and expects the same bits. The width prevents the short cut.
void expectSameDouble(const std::string& text) {
    const auto bits = [&](const wchar_t* format) {
        Reading<BaseStream> in(text + " ");
        double value = -1;
        EXPECT_EQ(in.stream.formattedRead(format, &value), 1) << text;
        return std::bit_cast<std::uint64_t>(value);
    };
    EXPECT_EQ(bits(L"%lg"), bits(L"%340lg")) << text;
}

TEST(ShortCuts, ReadADoubleAsTheWholeWayDoes) {
    std::mt19937_64 engine(17);
    char text[64];
    for (int round = 0; round < MZ_RANDOM_VALUES / 4 && !HasFailure(); ++round) {
        const auto any = std::bit_cast<double>(engine());
        if (std::isfinite(any)) {
            std::snprintf(text, sizeof text, "%.*g", static_cast<int>(1 + engine() % 18), any);
            expectSameDouble(text);
        }
        // Digits and a point anywhere.
        std::string digits = std::to_string(engine() >> (engine() % 64));
        digits.insert(engine() % (digits.size() + 1), ".");
        expectSameDouble(digits);
        expectSameDouble(digits + "e" + std::to_string(static_cast<int>(engine() % 660) - 340));
    }
}

TEST(ShortCuts, ReadADoubleHalfwayBetweenTwoAsTheWholeWayDoes) {
    for (std::uint64_t number = (std::uint64_t{1} << 53) - 50;
         number < (std::uint64_t{1} << 53) + 200; ++number)
        for (const char* const end : {"", ".0", ".5", "e1", "0", "00", "e-1", "e22", "e-22", "e23"})
            expectSameDouble(std::to_string(number) + end);
    for (const char* const text : {"0",
                                   "-0",
                                   "0.0",
                                   "0e5",
                                   "1e22",
                                   "1e23",
                                   "8.5e-324",
                                   "4.9e-324",
                                   "2.4e-324",
                                   "2.2250738585072011e-308",
                                   "2.2250738585072014e-308",
                                   "1.7976931348623157e308",
                                   "1.7976931348623158e308",
                                   "1.7976931348623159e308",
                                   "1e308",
                                   "1e309",
                                   "1e-307",
                                   "1e-323",
                                   "9007199254740993",
                                   "9007199254740992.5",
                                   "999999999999999999",
                                   "1e330",
                                   "1e-330",
                                   "1e331",
                                   "1e-331",
                                   "123456789012345678e-340",
                                   "123456789012345678e291"})
        expectSameDouble(text);
}

} // namespace
