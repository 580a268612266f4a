// SPDX-License-Identifier: BSL-1.0
// Values through streams in binary and text form, compared with the same work by hand on standard
// streams.
#include "comparisons.h"
#include "measure.h"

#include "components/componentManager/binaryStream.h"
#include "components/componentManager/textStream.h"

#include <array>
#include <charconv>
#include <clocale>
#include <cstdlib>
#include <cstring>
#include <random>
#include <sstream>
#include <string>
#include <vector>

namespace Mz::Benchmarks {

namespace {

/// The number of single values: large enough to make fixed costs negligible, small enough for the
/// cache.
constexpr int valueCount = 20'000;

/// The number of values in an array: larger than a small cache, as the arrays of a mesh are.
constexpr int arrayCount = 1'000'000;

template <class T>
std::vector<T> randomValues(int count = valueCount);

template <>
std::vector<int> randomValues<int>(int count) {
    std::mt19937 random(20'001);
    std::vector<int> values(static_cast<std::size_t>(count));
    for (int& value : values)
        value = static_cast<int>(random());
    return values;
}

template <>
std::vector<double> randomValues<double>(int count) {
    std::mt19937_64 random(20'002);
    std::uniform_real_distribution<double> distribution(-1000, 1000);
    std::vector<double> values(static_cast<std::size_t>(count));
    for (double& value : values)
        value = distribution(random);
    return values;
}

std::uint32_t swapped(int value) {
    return __builtin_bswap32(static_cast<std::uint32_t>(value));
}

std::uint64_t swapped(double value) {
    std::uint64_t bits;
    std::memcpy(&bits, &value, sizeof bits);
    return __builtin_bswap64(bits);
}

template <class T>
void unswap(T& value) {
    const auto bits = swapped(value);
    std::memcpy(&value, &bits, sizeof value);
}

/// Returns what `write` writes to a standard stream.
template <class Write>
std::string written(const Write& write) {
    std::ostringstream out;
    write(out);
    return out.str();
}

template <class T, class Stream>
std::string valuesIn(int count = valueCount) {
    const std::vector<T> values = randomValues<T>(count);
    return written([&](std::ostream& out) {
        QrOutBuffer io(&out);
        Stream stream(&io);
        for (const T value : values)
            stream << value;
    });
}

/// Repeats `work` on the same output from its beginning, so that no memory is allocated. At the end
/// checks that the output is `expected`.
template <class Work>
void writeRepeatedly(benchmark::State& state, const std::string& expected, const Work& work) {
    std::ostringstream out;
    for (auto iteration : state) {
        static_cast<void>(iteration);
        out.seekp(0);
        work(out);
    }
    if (out.str() != expected)
        state.SkipWithError("something else was written");
}

/// The same for input. At the end checks that the values that `work` read are `expected`.
template <class T, class Work>
void readRepeatedly(benchmark::State& state, const std::string& content,
                    const std::vector<T>& expected, const Work& work) {
    std::istringstream in(content);
    std::vector<T> values(expected.size());
    for (auto iteration : state) {
        static_cast<void>(iteration);
        in.clear();
        in.seekg(0);
        work(in, values);
    }
    if (std::memcmp(values.data(), expected.data(), sizeof(T) * values.size()) != 0)
        state.SkipWithError("something else was read");
}

// ---- Binary ---------------------------------------------------------------------------------

template <class T>
void writeArray(benchmark::State& state) {
    const std::vector<T> values = randomValues<T>(arrayCount);
    writeRepeatedly(state, valuesIn<T, QrBinaryStream>(arrayCount), [&](std::ostream& out) {
        QrOutBuffer io(&out);
        QrBinaryStream stream(&io);
        stream.write(values.front(), arrayCount);
    });
}

template <class T>
void writeArrayByHand(benchmark::State& state) {
    const std::vector<T> values = randomValues<T>(arrayCount);
    std::vector<decltype(swapped(T()))> block(values.size());
    writeRepeatedly(state, valuesIn<T, QrBinaryStream>(arrayCount), [&](std::ostream& out) {
        for (std::size_t index = 0; index < values.size(); ++index)
            block[index] = swapped(values[index]);
        out.write(reinterpret_cast<const char*>(block.data()),
                  static_cast<std::streamsize>(sizeof(T) * block.size()));
    });
}

template <class T>
void readArray(benchmark::State& state) {
    readRepeatedly(state, valuesIn<T, QrBinaryStream>(arrayCount), randomValues<T>(arrayCount),
                   [](std::istream& in, std::vector<T>& values) {
                       QrInBuffer io(&in);
                       QrBinaryStream stream(&io);
                       stream.read(values.front(), arrayCount);
                   });
}

template <class T>
void readArrayByHand(benchmark::State& state) {
    readRepeatedly(state, valuesIn<T, QrBinaryStream>(arrayCount), randomValues<T>(arrayCount),
                   [](std::istream& in, std::vector<T>& values) {
                       in.read(reinterpret_cast<char*>(values.data()),
                               static_cast<std::streamsize>(sizeof(T) * values.size()));
                       for (T& value : values)
                           unswap(value);
                   });
}

template <class T, class Stream>
void writeValues(benchmark::State& state) {
    const std::vector<T> values = randomValues<T>();
    writeRepeatedly(state, valuesIn<T, Stream>(), [&](std::ostream& out) {
        QrOutBuffer io(&out);
        Stream concrete(&io);
        QrStream* const stream = opaque<QrStream>(&concrete);
        for (const T value : values)
            *stream << value;
    });
}

template <class T, class Stream>
void readValues(benchmark::State& state) {
    readRepeatedly(state, valuesIn<T, Stream>(), randomValues<T>(),
                   [](std::istream& in, std::vector<T>& values) {
                       QrInBuffer io(&in);
                       Stream concrete(&io);
                       QrStream* const stream = opaque<QrStream>(&concrete);
                       for (T& value : values)
                           *stream >> value;
                   });
}

template <class T>
void writeValuesByHand(benchmark::State& state) {
    const std::vector<T> values = randomValues<T>();
    writeRepeatedly(state, valuesIn<T, QrBinaryStream>(), [&](std::ostream& out) {
        std::streambuf* const buffer = opaque(out.rdbuf());
        for (const T value : values) {
            const auto bits = swapped(value);
            buffer->sputn(reinterpret_cast<const char*>(&bits), sizeof bits);
        }
    });
}

template <class T>
void readValuesByHand(benchmark::State& state) {
    readRepeatedly(state, valuesIn<T, QrBinaryStream>(), randomValues<T>(),
                   [](std::istream& in, std::vector<T>& values) {
                       std::streambuf* const buffer = opaque(in.rdbuf());
                       for (T& value : values) {
                           buffer->sgetn(reinterpret_cast<char*>(&value), sizeof value);
                           unswap(value);
                       }
                   });
}

// ---- Text -----------------------------------------------------------------------------------

char* toCharacters(char* begin, char* end, int value) {
    return std::to_chars(begin, end, value).ptr;
}

char* toCharacters(char* begin, char* end, double value) {
    return std::to_chars(begin, end, value, std::chars_format::general, 16).ptr;
}

template <class T>
void writeTextByHand(benchmark::State& state) {
    constexpr std::ptrdiff_t longestNumber = 32;
    constexpr std::ptrdiff_t longestLine = 70;
    const std::vector<T> values = randomValues<T>();
    std::vector<char> block(longestNumber * values.size());
    writeRepeatedly(state, valuesIn<T, QrTextStream>(), [&](std::ostream& out) {
        char* at = block.data();
        const char* line = at;
        bool first = true;
        for (const T value : values) {
            if (!first) {
                const bool ends = at - line > longestLine;
                *at++ = ends ? '\n' : ' ';
                line = ends ? at : line;
            }
            first = false;
            at = toCharacters(at, at + longestNumber, value);
        }
        out.write(block.data(), at - block.data());
    });
}

template <class T>
void readTextByHand(benchmark::State& state) {
    const std::string content = valuesIn<T, QrTextStream>();
    std::vector<T> expected(valueCount);
    std::vector<char> block(content.size());
    const auto parse = [&](std::istream& in, std::vector<T>& values) {
        in.read(block.data(), static_cast<std::streamsize>(block.size()));
        const char* at = block.data();
        const char* const end = at + block.size();
        for (T& value : values) {
            while (at != end && (*at == ' ' || *at == '\n'))
                ++at;
            at = std::from_chars(at, end, value).ptr;
        }
    };
    std::istringstream once(content);
    parse(once, expected);
    readRepeatedly(state, content, expected, parse);
}

/// Returns the values that are read back from text: 16 digits do not represent every `double`
/// exactly.
template <class T>
std::vector<T> textValues() {
    std::istringstream in(valuesIn<T, QrTextStream>());
    std::vector<T> values(valueCount);
    for (T& value : values)
        in >> value;
    return values;
}

template <class T>
void readTextValues(benchmark::State& state) {
    readRepeatedly(state, valuesIn<T, QrTextStream>(), textValues<T>(),
                   [](std::istream& in, std::vector<T>& values) {
                       QrInBuffer io(&in);
                       QrTextStream concrete(&io);
                       QrStream* const stream = opaque<QrStream>(&concrete);
                       for (T& value : values)
                           *stream >> value;
                   });
}

/// Runs `body` in a locale with a decimal comma.
RatioTable::Body underDecimalComma(RatioTable::Body body) {
    return [body = std::move(body)](benchmark::State& state) {
        setenv("LOCPATH", MZ_LOCALE_FOLDER, 1);
        if (!std::setlocale(LC_ALL, "de_DE.UTF-8") || *std::localeconv()->decimal_point != ',')
            state.SkipWithError("there is no locale with a decimal comma");
        else
            body(state);
        std::setlocale(LC_ALL, "C");
    };
}

template <class T>
void addTypes(RatioTable& table, const std::string& type, double single, double textWrite,
              double textRead) {
    const std::string swaps = "byte swap loop, one ";
    table.add({"binary/" + type + "ArrayWrite", "binary array of " + type + ", write",
               swaps + "ostream::write", 0.85},
              writeArray<T>, writeArrayByHand<T>);
    table.add({"binary/" + type + "ArrayRead", "binary array of " + type + ", read",
               swaps + "istream::read", 1.05},
              readArray<T>, readArrayByHand<T>);
    table.add({"binary/" + type + "Write", "binary " + type + " by <<",
               "swap each into the stream's buffer", single},
              writeValues<T, QrBinaryStream>, writeValuesByHand<T>);
    table.add({"binary/" + type + "Read", "binary " + type + " by >>",
               "swap each out of the stream's buffer", single},
              readValues<T, QrBinaryStream>, readValuesByHand<T>);
    table.add(
        {"text/" + type + "Write", "text " + type + " by <<", "to_chars and one write", textWrite},
        writeValues<T, QrTextStream>, writeTextByHand<T>);
    table.add(
        {"text/" + type + "Read", "text " + type + " by >>", "one read and from_chars", textRead},
        readTextValues<T>, readTextByHand<T>);
    table.add({"text/" + type + "WriteComma", "the same write under a decimal comma",
               "the same under \"C\"", 1.05},
              underDecimalComma(writeValues<T, QrTextStream>), writeValues<T, QrTextStream>);
    table.add({"text/" + type + "ReadComma", "the same read under a decimal comma",
               "the same under \"C\"", 1.05},
              underDecimalComma(readTextValues<T>), readTextValues<T>);
}

} // namespace

void addStreamComparisons(RatioTable& table) {
    addTypes<int>(table, "int", 3, 1.6, 2);
    addTypes<double>(table, "double", 1.6, 0.75, 1.5);
}

} // namespace Mz::Benchmarks
