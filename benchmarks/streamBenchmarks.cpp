// SPDX-License-Identifier: BSL-1.0
// Values through streams in binary and text form, to memory, to files and to a buffer of the host,
// compared with the same work by hand on standard streams.
#include "comparisons.h"
#include "decimalComma.h"
#include "measure.h"
#include "streamWork.h"

#include "components/componentManager/binaryStream.h"
#include "components/componentManager/textStream.h"

#include <array>
#include <charconv>
#include <clocale>
#include <cstring>
#include <sstream>
#include <string>
#include <vector>

namespace Mz::Benchmarks {

namespace {

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

template <class T, class Stream, int Count>
void writeValues(benchmark::State& state) {
    const std::vector<T> values = randomValues<T>(Count);
    writeRepeatedly(state, valuesIn<T, Stream>(Count), [&](std::ostream& out) {
        QrOutBuffer io(&out);
        Stream concrete(&io);
        QrStream* const stream = opaque<QrStream>(&concrete);
        for (const T value : values)
            *stream << value;
    });
}

template <class T>
void readValues(benchmark::State& state) {
    readRepeatedly(state, valuesIn<T, QrBinaryStream>(valueCount), randomValues<T>(valueCount),
                   [](std::istream& in, std::vector<T>& values) {
                       QrInBuffer io(&in);
                       QrBinaryStream concrete(&io);
                       QrStream* const stream = opaque<QrStream>(&concrete);
                       for (T& value : values)
                           *stream >> value;
                   });
}

template <class T>
void writeValuesByHand(benchmark::State& state) {
    const std::vector<T> values = randomValues<T>(valueCount);
    writeRepeatedly(state, valuesIn<T, QrBinaryStream>(valueCount), [&](std::ostream& out) {
        std::streambuf* const buffer = opaque(out.rdbuf());
        for (const T value : values) {
            const auto bits = swapped(value);
            buffer->sputn(reinterpret_cast<const char*>(&bits), sizeof bits);
        }
    });
}

template <class T>
void readValuesByHand(benchmark::State& state) {
    readRepeatedly(state, valuesIn<T, QrBinaryStream>(valueCount), randomValues<T>(valueCount),
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
    const std::vector<T> values = randomValues<T>(textCount);
    std::vector<char> block(longestNumber * values.size());
    writeRepeatedly(state, valuesIn<T, QrTextStream>(textCount), [&](std::ostream& out) {
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
    const std::string& content = valuesIn<T, QrTextStream>(textCount);
    std::vector<T> expected(textCount);
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

template <class T>
void readTextValues(benchmark::State& state) {
    readRepeatedly(state, valuesIn<T, QrTextStream>(textCount), textValues<T>(),
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
        if (!setDecimalComma())
            state.SkipWithError("there is no locale with a decimal comma");
        else
            body(state);
        std::setlocale(LC_ALL, "C");
    };
}

/// The targets of the lines of one type.
struct Reaches {
    double arrayWrite, arrayRead, write, read, textWrite, textRead;
};

template <class T>
void addTypes(RatioTable& table, const std::string& type, const Reaches& reaches) {
    const std::string swaps = "byte swap loop, one ";
    table.add({"binary/" + type + "ArrayWrite", "binary array of " + type + ", write",
               swaps + "ostream::write", reaches.arrayWrite},
              writeArray<T>, writeArrayByHand<T>);
    table.add({"binary/" + type + "ArrayRead", "binary array of " + type + ", read",
               swaps + "istream::read", reaches.arrayRead},
              readArray<T>, readArrayByHand<T>);
    table.add({"binary/" + type + "Write", "binary " + type + " by <<",
               "swap each into the stream's buffer", reaches.write},
              writeValues<T, QrBinaryStream, valueCount>, writeValuesByHand<T>);
    table.add({"binary/" + type + "Read", "binary " + type + " by >>",
               "swap each out of the stream's buffer", reaches.read},
              readValues<T>, readValuesByHand<T>);
    table.add({"text/" + type + "Write", "text " + type + " by <<", "to_chars and one write",
               reaches.textWrite},
              writeValues<T, QrTextStream, textCount>, writeTextByHand<T>);
    table.add({"text/" + type + "Read", "text " + type + " by >>", "one read and from_chars",
               reaches.textRead},
              readTextValues<T>, readTextByHand<T>);
    table.add({"text/" + type + "WriteComma", "text " + type + " by << under a decimal comma",
               "the same under \"C\"", 1.05},
              underDecimalComma(writeValues<T, QrTextStream, textCount>),
              writeValues<T, QrTextStream, textCount>);
    table.add({"text/" + type + "ReadComma", "text " + type + " by >> under a decimal comma",
               "the same under \"C\"", 1.05},
              underDecimalComma(readTextValues<T>), readTextValues<T>);
}

} // namespace

void addStreamComparisons(RatioTable& table) {
    addTypes<int>(table, "int", {0.6, 0.7, 1.15, 1.25, 1.4, 1.7});
    addTypes<double>(table, "double", {0.8, 0.9, 1.1, 1.25, 0.7, 1.45});
}

} // namespace Mz::Benchmarks
