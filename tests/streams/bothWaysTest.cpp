// SPDX-License-Identifier: BSL-1.0
// Tests that each short cut has the results, and on a foreign medium the calls, of the whole way by
// the functions of the standard stream.
#include "tests/streams/bothWays.h"
#include "tests/support/temporaryDirectory.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <functional>
#include <limits>
#include <memory>

namespace {

using namespace Mz::Test;
using Mz::int64;
using Mz::QrBinaryStream;
using Mz::QrInBuffer;
using Mz::QrOutBuffer;
using Mz::QrStream;
using Mz::QrTextStream;

constexpr std::ios::iostate everyFlag = std::ios::badbit | std::ios::failbit | std::ios::eofbit;

// ---- Output ---------------------------------------------------------------------------------

using Writer = std::function<void(QrStream&, QrOutBuffer&)>;

template <class T>
void writeArrays(QrStream& stream) {
    std::vector<T> values(9000);
    for (std::size_t index = 0; index < values.size(); ++index)
        values[index] = static_cast<T>(index * 77);
    for (const int count : {0, 1, 2, 3, 255, 256, 257, 2047, 9000})
        stream.write(values[0], count);
}

void writeNumbers(QrStream& stream) {
    stream << 0 << -1 << 10 << 99 << 100 << 12345 << std::numeric_limits<int>::min()
           << std::numeric_limits<int>::max() << 4294967295U << std::numeric_limits<int64>::min()
           << std::numeric_limits<unsigned long long>::max() << static_cast<short>(-7)
           << static_cast<unsigned char>(200) << 'A' << 7L << 8UL << 0.5F << 1e-30F << 0.5 << 1e300
           << -1.0 / 3 << 1e15 << std::numeric_limits<double>::infinity() << true << false << 3
           << std::wstring(L"abc") << 4;
}

const std::vector<Writer>& writers() {
    static const std::vector<Writer> all = {
        [](QrStream& stream, QrOutBuffer&) { writeNumbers(stream); },
        [](QrStream& stream, QrOutBuffer&) {
            for (int round = 0; round < 300; ++round)
                writeNumbers(stream);
        },
        [](QrStream& stream, QrOutBuffer&) { stream << 0.5F; },
        [](QrStream& stream, QrOutBuffer&) { stream << 1e-5F; },
        [](QrStream& stream, QrOutBuffer&) { stream << 2.5; },
        [](QrStream& stream, QrOutBuffer&) { stream << 5e-324; },
        [](QrStream& stream, QrOutBuffer&) { writeArrays<int>(stream); },
        [](QrStream& stream, QrOutBuffer&) { writeArrays<double>(stream); },
        [](QrStream& stream, QrOutBuffer&) { writeArrays<short>(stream); },
        [](QrStream& stream, QrOutBuffer&) { writeArrays<char>(stream); },
        [](QrStream& stream, QrOutBuffer&) { writeArrays<long>(stream); },
        [](QrStream& stream, QrOutBuffer&) {
            std::array<bool, 3000> flags{};
            flags[2000] = true;
            stream.write(flags[0], 3000);
        },
        [](QrStream& stream, QrOutBuffer&) {
            std::vector<long> values(5000, 6);
            values[4321] = std::numeric_limits<long>::max(); // Does not fit where it has 64 bits.
            stream.write(values[0], 5000);
        },
        [](QrStream& stream, QrOutBuffer& io) {
            stream << 1;
            io.write('x');
            io.writeChar(L"wide", 4);
            io.writeChar("narrow", 6);
            io.writeEol();
            io.writeSpace();
            io.writeChar(L'c');
            io.write("bytes", 5);
            stream << 2.5;
        }};
    return all;
}

/// Runs a writer on a stream of class `Stream` on `sink` and returns what happened.
template <class Stream>
std::string write(std::ostream& sink, Way way, const Writer& writer) {
    choose(sink, way);
    QrOutBuffer io(&sink);
    Stream stream(&io);
    return outcome(sink, [&] {
        writer(stream, io);
        return std::string();
    });
}

template <class Stream>
class WrittenBothWays : public testing::Test {};
using Streams = testing::Types<QrTextStream, QrBinaryStream, BaseStream>;
TYPED_TEST_SUITE(WrittenBothWays, Streams);

TYPED_TEST(WrittenBothWays, ToMemoryIsEqual) {
    for (const Writer& writer : writers())
        for (const std::ios::iostate mask : {std::ios::goodbit, everyFlag})
            for (const std::size_t before : {0U, 1U, 50U, 5000U, 500'000U}) {
                std::string told[2];
                for (const Way way : {Way::Short, Way::Whole}) {
                    // The output overwrites what was there before, and no more.
                    std::stringstream sink(std::string(before, '#'));
                    sink.seekp(static_cast<std::streamoff>(before / 10));
                    sink.exceptions(mask);
                    std::string& text = told[way == Way::Short];
                    text = write<TypeParam>(sink, way, writer);
                    text += sink.str();
                }
                EXPECT_EQ(told[0], told[1]) << before;
            }
}

TYPED_TEST(WrittenBothWays, ToAFileIsEqual) {
    const TemporaryDirectory folder;
    for (const Writer& writer : writers())
        for (const int size : {-1, 0, 1, 2, 16, 60, 5000}) {
            std::string told[2];
            for (const Way way : {Way::Short, Way::Whole}) {
                const std::filesystem::path path = folder.path() / "file";
                std::vector<char> memory(5000);
                std::fstream sink;
                if (size >= 0)
                    sink.rdbuf()->pubsetbuf(size ? memory.data() : nullptr, size);
                sink.open(path, std::ios::binary | std::ios::in | std::ios::out | std::ios::trunc);
                std::string& text = told[way == Way::Short];
                text = write<TypeParam>(sink, way, writer);
                // The same object reads what it wrote.
                sink.tie(nullptr);
                sink.seekg(0);
                text += std::string(std::istreambuf_iterator<char>(sink), {});
            }
            EXPECT_EQ(told[0], told[1]) << size;
        }
}

/// Runs a writer on a foreign medium; returns what happened and the calls of the medium.
template <class Stream>
std::string writeForeign(Way way, const Writer& writer, RecordingBuffer& medium,
                         std::ios::iostate mask) {
    std::ostream sink(&medium);
    sink.exceptions(mask);
    std::string told = write<Stream>(sink, way, writer);
    medium.empty();
    told += medium.bytes;
    for (const std::string& call : medium.calls)
        told += call + ";";
    return told;
}

TYPED_TEST(WrittenBothWays, ToAForeignMediumMakesTheSameCalls) {
    for (const Writer& writer : writers())
        for (const bool hasAreas : {false, true})
            for (const bool throwing : {false, true})
                for (const std::size_t failsAt : {0U, 1U, 2U, 3U, 4U, 7U, 20U, 21U, 1'000'000U}) {
                    const auto happens = [&](Way way) {
                        RecordingBuffer medium({}, hasAreas);
                        medium.failsAt = failsAt;
                        medium.throws = throwing;
                        return writeForeign<TypeParam>(way, writer, medium,
                                                       throwing ? everyFlag : std::ios::goodbit);
                    };
                    EXPECT_EQ(happens(Way::Short), happens(Way::Whole)) << failsAt << hasAreas;
                }
}

TYPED_TEST(WrittenBothWays, ToAStreamThatIsFlushedEachTimeMakesTheSameCalls) {
    for (const bool fromTheBeginning : {true, false}) {
        std::vector<std::string> calls[2];
        for (const Way way : {Way::Short, Way::Whole}) {
            RecordingBuffer medium;
            std::ostream sink(&medium);
            if (fromTheBeginning)
                sink.setf(std::ios::unitbuf);
            else
                medium.flushed = &sink;
            write<TypeParam>(sink, way, writers()[0]);
            calls[way == Way::Short] = medium.calls;
        }
        EXPECT_EQ(calls[0], calls[1]);
        EXPECT_NE(std::count(calls[0].begin(), calls[0].end(), "sync"), 0);
    }
}

TYPED_TEST(WrittenBothWays, ToBuffersThatAreSwappedBetweenCallsIsEqual) {
    std::string told[2];
    for (const Way way : {Way::Short, Way::Whole}) {
        std::stringbuf first;
        WatchedBuffer second;
        RecordingBuffer third;
        std::stringbuf fourth(std::ios::in); // Takes no output.
        std::ostream sink(&first);
        choose(sink, way);
        QrOutBuffer io(&sink);
        TypeParam stream(&io);
        const std::array<std::streambuf*, 4> buffers{&first, &second, &third, &fourth};
        std::string& text = told[way == Way::Short];
        for (int round = 0; round < 30; ++round) {
            sink.rdbuf(buffers[static_cast<std::size_t>(round) % 4]);
            text += outcome(sink, [&] {
                stream << round << round / 8.0;
                const std::array<int, 300> values{round};
                stream.write(values[0], 300);
                return std::string();
            });
        }
        text += first.str() + "|" + second.str() + "|" + third.bytes;
        for (const std::string& call : third.calls)
            text += call;
        EXPECT_NE(text.find("ExWriteError"), std::string::npos);
    }
    EXPECT_EQ(told[0], told[1]);
}

// ---- Input ----------------------------------------------------------------------------------

using Reader = std::function<std::string(QrStream&, QrInBuffer&)>;

template <class T>
std::string readSingle(QrStream& stream) {
    T value{};
    try {
        stream >> value;
    } catch (const Mz::QrStreamEx::ExReadError&) {
        return "none;";
    }
    return toHex({reinterpret_cast<const char*>(&value), sizeof value}) + ";";
}

template <class T>
std::string readArray(QrStream& stream, int count) {
    const auto values = std::make_unique<T[]>(static_cast<std::size_t>(count));
    const int got = stream.read(values[0], count);
    return std::to_string(got) + toHex({reinterpret_cast<const char*>(values.get()),
                                        sizeof(T) * static_cast<std::size_t>(got)});
}

std::string readByByte(QrInBuffer& io) {
    char character = '!';
    wchar_t wide[3]{};
    std::string told = std::to_string(io.readChar(character)) + character;
    told += std::to_string(io.readChar(wide, 3, 3));
    for (const wchar_t c : wide)
        told += std::to_string(static_cast<int>(c)) + ",";
    io.ungetc('-');
    io.skipWhiteSpace(2);
    return told + std::to_string(io.read());
}

const std::vector<Reader>& readers() {
    static const std::vector<Reader> all = {
        [](QrStream& stream, QrInBuffer&) {
            return readSingle<int>(stream) + readSingle<double>(stream) +
                   readSingle<short>(stream) + readSingle<int64>(stream) +
                   readSingle<float>(stream) + readSingle<long>(stream) + readSingle<char>(stream) +
                   readSingle<bool>(stream) + readSingle<int>(stream);
        },
        [](QrStream& stream, QrInBuffer& io) {
            return readSingle<int>(stream) + readByByte(io) + readSingle<double>(stream) +
                   readByByte(io) + readSingle<int>(stream);
        },
        [](QrStream& stream, QrInBuffer& io) {
            return readArray<int>(stream, 3) + readByByte(io) + readArray<double>(stream, 2);
        },
        [](QrStream& stream, QrInBuffer&) {
            return readArray<short>(stream, 5) + readArray<char>(stream, 3) +
                   readArray<long>(stream, 2) + readArray<bool>(stream, 4) +
                   readArray<wchar_t>(stream, 2) + readArray<int>(stream, 9000);
        },
        [](QrStream& stream, QrInBuffer& io) {
            std::string told = readArray<int>(stream, 1000) + readByByte(io);
            told += readArray<double>(stream, 3000) + readByByte(io);
            return told + readArray<int>(stream, 20'000);
        }};
    return all;
}

/// Runs a reader on a stream of class `Stream` on `source`; returns what happened and what is left.
template <class Stream>
std::string read(std::istream& source, Way way, const Reader& reader) {
    choose(source, way);
    QrInBuffer io(&source);
    Stream stream(&io);
    const std::string told = outcome(source, [&] { return reader(stream, io); });
    return told + outcome(source, [&] {
               const std::string before = std::to_string(io.tell()) + "|";
               return before + std::to_string(io.read()) + "|" + std::to_string(io.tell());
           });
}

std::vector<std::string> contents() {
    std::vector<std::string> all;
    const std::string text = "12 -0.125 77 99999999999 1e5 +3 65 1 42 007 x";
    for (std::size_t length = 0; length <= text.size(); ++length)
        all.push_back(text.substr(0, length));
    std::string bytes;
    for (int value = 0; value < 60; ++value)
        bytes += static_cast<char>(value * 41);
    for (std::size_t length = 0; length <= bytes.size(); length += 3)
        all.push_back(bytes.substr(0, length));
    std::string longText(100'000, '\0');
    for (std::size_t index = 0; index < longText.size(); ++index)
        longText[index] = static_cast<char>(index * index / 7);
    for (const std::size_t length : {8000U, 16'390U, 20'001U, 100'000U})
        all.push_back(longText.substr(0, length));
    all.push_back(std::string(100, ' ') + "5 " + std::string(100, '7') + " 8");
    return all;
}

template <class Stream>
class ReadBothWays : public testing::Test {};
TYPED_TEST_SUITE(ReadBothWays, Streams);

TYPED_TEST(ReadBothWays, FromMemoryIsEqual) {
    for (const std::string& content : contents())
        for (const Reader& reader : readers())
            for (const std::ios::iostate mask : {std::ios::goodbit, everyFlag}) {
                std::string told[2];
                for (const Way way : {Way::Short, Way::Whole}) {
                    std::istringstream source(content);
                    source.exceptions(mask);
                    told[way == Way::Short] = read<TypeParam>(source, way, reader);
                }
                EXPECT_EQ(told[0], told[1]) << toHex(content.substr(0, 60));
            }
}

TYPED_TEST(ReadBothWays, FromABufferThatWasWrittenBetweenTheReadsIsEqual) {
    for (const std::string& content : contents())
        for (const Reader& reader : readers()) {
            std::string told[2];
            for (const Way way : {Way::Short, Way::Whole}) {
                std::stringstream source(content.substr(0, content.size() / 2));
                source.seekp(0, std::ios::end);
                choose(source, way);
                std::string& text = told[way == Way::Short];
                text = std::to_string(QrInBuffer(&source).read());
                // The area of the buffer does not show this yet.
                source.rdbuf()->sputn(
                    content.data() + content.size() / 2,
                    static_cast<std::streamsize>(content.size() - content.size() / 2));
                text += read<TypeParam>(source, way, reader);
            }
            EXPECT_EQ(told[0], told[1]) << toHex(content.substr(0, 60));
        }
}

TYPED_TEST(ReadBothWays, FromAFileIsEqual) {
    const TemporaryDirectory folder;
    for (const std::string& content : contents()) {
        const std::filesystem::path path = folder.write("file", content);
        for (const Reader& reader : readers())
            for (const int size : {-1, 0, 1, 3, 16}) {
                std::string told[2];
                for (const Way way : {Way::Short, Way::Whole}) {
                    char memory[16];
                    std::ifstream source;
                    if (size >= 0)
                        source.rdbuf()->pubsetbuf(size ? memory : nullptr, size);
                    source.open(path, std::ios::binary);
                    told[way == Way::Short] = read<TypeParam>(source, way, reader);
                }
                EXPECT_EQ(told[0], told[1]) << size << " " << toHex(content.substr(0, 60));
            }
    }
}

TYPED_TEST(ReadBothWays, FromAForeignMediumMakesTheSameCalls) {
    for (const std::string& content : contents())
        for (const Reader& reader : readers())
            for (const bool hasAreas : {false, true})
                for (const std::size_t failsAt : {0U, 1U, 2U, 3U, 5U, 8U, 13U, 1'000'000U}) {
                    const auto happens = [&](Way way) {
                        RecordingBuffer medium(content, hasAreas);
                        medium.failsAt = failsAt;
                        medium.throws = failsAt % 2 != 0;
                        std::istream source(&medium);
                        source.exceptions(medium.throws ? everyFlag : std::ios::goodbit);
                        std::string told = read<TypeParam>(source, way, reader);
                        for (const std::string& call : medium.calls)
                            told += call + ";";
                        return told;
                    };
                    EXPECT_EQ(happens(Way::Short), happens(Way::Whole))
                        << failsAt << hasAreas << content.substr(0, 60);
                }
}

TYPED_TEST(ReadBothWays, FromBuffersThatAreSwappedBetweenCallsIsEqual) {
    std::string told[2];
    for (const Way way : {Way::Short, Way::Whole}) {
        std::string bytes(4000, '\0');
        for (std::size_t index = 0; index < bytes.size(); ++index)
            bytes[index] = index % 5 == 4 ? ' ' : static_cast<char>('0' + index % 10);
        std::stringbuf first(bytes);
        WatchedBuffer second(bytes);
        RecordingBuffer third(bytes);
        std::istream source(&first);
        choose(source, way);
        QrInBuffer io(&source);
        TypeParam stream(&io);
        const std::array<std::streambuf*, 3> buffers{&first, &second, &third};
        std::string& text = told[way == Way::Short];
        for (std::size_t round = 0; round < 30; ++round) {
            source.rdbuf(buffers[round % 3]);
            text += readSingle<int>(stream) + readSingle<double>(stream) +
                    readArray<short>(stream, 7) + readByByte(io);
        }
        for (const std::string& call : third.calls)
            text += call;
    }
    EXPECT_EQ(told[0], told[1]);
}

} // namespace
