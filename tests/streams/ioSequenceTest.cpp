// SPDX-License-Identifier: BSL-1.0
// Tests which calls, and in which order, a stream makes on its IO.
#include "tests/streams/recordingIO.h"
#include "tests/streams/support.h"

#include <gmock/gmock.h>

#include <array>

namespace {

using namespace Mz::Test;
using Mz::QrBinaryStream;
using Mz::QrStream;
using Mz::QrStreamEx;
using Mz::QrTextStream;
using testing::ElementsAre;
using testing::IsEmpty;

/// Returns the calls that the IO receives while `work` uses a stream of class `Stream` on it.
template <class Stream, class Work>
std::vector<std::string> calls(Work&& work, const std::string& input = {}) {
    RecordingIO io(input);
    Stream stream(&io);
    work(static_cast<QrStream&>(stream));
    return io.calls;
}

TEST(IOSequence, ConstructionAndDestructionTouchNothing) {
    EXPECT_THAT(calls<QrTextStream>([](QrStream&) {}), IsEmpty());
}

TEST(IOSequence, TextGoesOutSeparatorFirst) {
    EXPECT_THAT(calls<QrTextStream>([](QrStream& s) { s << 12 << 345U << 1.5; }),
                ElementsAre("writeChar wide 2", "writeSpace", "writeChar wide 3", "writeSpace",
                            "writeChar wide 3"));
    EXPECT_THAT(calls<QrTextStream>([](QrStream& s) {
                    s.formattedWrite(L"%71d", 0);
                    s << true << 1 << false;
                }),
                ElementsAre("writeChar wide 71", "writeChar wide 1", "writeChar wide 1", "writeEol",
                            "writeChar wide 1"));
    EXPECT_THAT(
        calls<QrTextStream>([](QrStream& s) { s << std::wstring(L"abc") << 1; }),
        ElementsAre("writeChar wide 1", "writeSpace", "writeChar wide 3", "writeChar wide 1"));
}

TEST(IOSequence, BinaryValuesGoOutInBlocksOf1024Bytes) {
    const std::array<int, 300> numbers{};
    const std::array<double, 129> doubles{};
    const std::array<short, 513> shorts{};
    const std::array<bool, 1025> flags{};
    const std::array<char, 2049> bytes{};
    const auto write = [](const auto& values) {
        return calls<QrBinaryStream>(
            [&](QrStream& s) { s.write(values[0], static_cast<int>(values.size())); });
    };
    EXPECT_THAT(write(numbers), ElementsAre("write 1024", "write 176"));
    EXPECT_THAT(write(doubles), ElementsAre("write 1024", "write 8"));
    EXPECT_THAT(write(shorts), ElementsAre("write 1024", "write 2"));
    EXPECT_THAT(write(flags), ElementsAre("write 1024", "write 1"));
    EXPECT_THAT(write(bytes), ElementsAre("write 1024", "write 1024", "write 1"));
    EXPECT_THAT(write(std::array<long, 257>{}), ElementsAre("write 1024", "write 4"));
    EXPECT_THAT(write(std::array<wchar_t, 513>{}), ElementsAre("write 1024", "write 2"));
    EXPECT_THAT(write(std::array<int, 256>{}), ElementsAre("write 1024"));
}

TEST(IOSequence, ABinaryBlockAfterTextEndsTheLineFirst) {
    const int number = 5;
    EXPECT_THAT(
        calls<BaseStream>([&](QrStream& s) {
            s << 1;
            s.write(number, 1);
            s.write(number, 1);
            s << 2;
        }),
        ElementsAre("writeChar wide 1", "writeEol", "write 4", "write 4", "writeChar wide 1"));
}

TEST(IOSequence, BinaryStringsAreLengthAndCharacters) {
    const std::array<std::wstring, 2> strings{L"abc", L""};
    EXPECT_THAT(calls<QrBinaryStream>([&](QrStream& s) {
                    s << wchar_t(65);
                    s.write(strings[0], 2);
                }),
                ElementsAre("writeChar wide 2", "writeEol", "write 4", "writeChar wide 3",
                            "write 4", "writeChar wide 0"));
}

TEST(IOSequence, CountedReadsAreOneCall) {
    std::array<int, 1000> numbers{};
    std::array<long, 1000> longs{};
    std::array<wchar_t, 1000> characters{};
    std::array<char, 5000> bytes{};
    const auto read = [](auto& values) {
        return calls<QrBinaryStream>(
            [&](QrStream& s) { s.read(values[0], static_cast<int>(values.size())); });
    };
    EXPECT_THAT(read(numbers), ElementsAre("read 4000"));
    EXPECT_THAT(read(longs), ElementsAre("read 4000"));
    EXPECT_THAT(read(characters), ElementsAre("read 2000"));
    EXPECT_THAT(read(bytes), ElementsAre("read 5000"));
}

TEST(IOSequence, BoolsAreReadInBlocksOf1024Bytes) {
    std::array<bool, 2049> flags{};
    EXPECT_THAT(calls<QrBinaryStream>([&](QrStream& s) { s.read(flags[0], 2049); },
                                      std::string(2049, '\1')),
                ElementsAre("read 1024", "read 1024", "read 1"));
    EXPECT_THAT(calls<QrBinaryStream>([&](QrStream& s) { s.read(flags[0], 2049); },
                                      std::string(1000, '\1')),
                ElementsAre("read 1024"));
}

TEST(IOSequence, StringsAreReadInOneCallWithoutALimitOfCharacters) {
    std::wstring value;
    EXPECT_THAT(
        calls<QrBinaryStream>([&](QrStream& s) { s >> value; }, fromHex("00 00 00 02 61 62")),
        ElementsAre("read 4", "readChar wide 2 2147483647"));
    EXPECT_THAT(
        calls<QrBinaryStream>([&](QrStream& s) { s.read(value, 1); }, fromHex("00 00 00 02 61 62")),
        ElementsAre("read 4", "readChar wide 2 2147483647"));
    EXPECT_THAT(calls<QrBinaryStream>([&](QrStream& s) { s >> value; }, fromHex("00 00 00 00")),
                ElementsAre("read 4", "readChar wide 0 2147483647"));
}

TEST(IOSequence, BoolsOfTextAreReadOneCharacterAtATime) {
    bool flags[2];
    EXPECT_THAT(calls<QrTextStream>(
                    [&](QrStream& s) {
                        s >> flags[0];
                        s.read(flags[0], 2);
                    },
                    "10"),
                ElementsAre("readChar wide 1 1", "readChar wide 1 1", "readChar wide 1 1"));
}

TEST(IOSequence, TheScannerLooksOneCharacterAheadAndGivesItBack) {
    int number = 0;
    EXPECT_THAT(calls<QrTextStream>([&](QrStream& s) { s >> number; }, " 42x"),
                ElementsAre("readChar wide", "readChar wide", "readChar wide", "readChar wide",
                            "ungetc wide 120"));
    // The end of input is read once. Nothing is put back.
    EXPECT_THAT(calls<QrTextStream>([&](QrStream& s) { s >> number; }, "7"),
                ElementsAre("readChar wide", "readChar wide"));
    // A number that uses its whole width needs no lookahead.
    EXPECT_THAT(calls<QrTextStream>([&](QrStream& s) { s.formattedRead(L"%1d", &number); }, "12"),
                ElementsAre("readChar wide"));
}

TEST(IOSequence, AnEmptyFormatReadsNothing) {
    EXPECT_THAT(calls<QrTextStream>([](QrStream& s) { EXPECT_EQ(s.formattedRead(L""), 0); }, "x"),
                IsEmpty());
}

TEST(IOSequence, AReadAfterTextWasWrittenSkipsTheSeparatorOnce) {
    bool flags[2];
    EXPECT_THAT(calls<BaseStream>(
                    [&](QrStream& s) {
                        s << 1;
                        s >> flags[0] >> flags[1];
                    },
                    " 10"),
                ElementsAre("writeChar wide 1", "skipWhiteSpace 1", "readChar wide 1 1",
                            "readChar wide 1 1"));
    EXPECT_TRUE(flags[0]);
    EXPECT_FALSE(flags[1]);
}

TEST(IOSequence, EveryReadThatIsNotFormattedSkipsAPendingSeparator) {
    const auto skips = [](auto&& read) {
        RecordingIO io(std::string(" ") + std::string(16, '\0'));
        BaseStream stream(&io);
        stream << 1;
        read(static_cast<QrStream&>(stream));
        return io.calls.size() > 1 && io.calls[1] == "skipWhiteSpace 1";
    };
    int number = 0;
    bool flag = false;
    char byte = 0;
    double real = 0;
    std::wstring string;
    EXPECT_TRUE(skips([&](QrStream& s) { s.read(number, 1); }));
    EXPECT_TRUE(skips([&](QrStream& s) { s.read(byte, 1); }));
    EXPECT_TRUE(skips([&](QrStream& s) { s.read(real, 1); }));
    EXPECT_TRUE(skips([&](QrStream& s) { s.read(flag, 1); }));
    EXPECT_TRUE(skips([&](QrStream& s) { s.read(string, 1); }));
    EXPECT_TRUE(skips([&](QrStream& s) { s >> flag; }));
    EXPECT_TRUE(skips([&](QrStream& s) { s.readObject(nullptr, nullptr, nullptr); }));
    EXPECT_FALSE(skips([&](QrStream& s) { s.formattedRead(L"%d", &number); }));
    EXPECT_FALSE(skips([&](QrStream& s) { s.read(number, 0); }));
}

TEST(IOSequence, AFormattedReadLeavesThePendingSeparatorDue) {
    int number = 0;
    bool flag = false;
    EXPECT_THAT(
        calls<QrTextStream>(
            [&](QrStream& s) {
                s << 1;
                s.formattedRead(L"%1d", &number);
                s >> flag;
            },
            "5 1"),
        ElementsAre("writeChar wide 1", "readChar wide", "skipWhiteSpace 1", "readChar wide 1 1"));
    EXPECT_EQ(number, 5);
    EXPECT_TRUE(flag);
}

TEST(IOSequence, AStringReadAfterWritingSkipsTheSeparatorBehindItsLength) {
    std::wstring value;
    EXPECT_THAT(calls<QrTextStream>(
                    [&](QrStream& s) {
                        s << 1;
                        s >> value;
                    },
                    "2 ab"),
                ElementsAre("writeChar wide 1", "readChar wide", "readChar wide", "ungetc wide 32",
                            "skipWhiteSpace 1", "readChar wide 2 2147483647"));
    EXPECT_EQ(value, L"ab");
}

TEST(IOSequence, ACountedStringReadAfterWritingSkipsTheSeparatorBehindItsLength) {
    std::wstring value;
    EXPECT_THAT(calls<QrTextStream>(
                    [&](QrStream& s) {
                        s << 1;
                        EXPECT_EQ(s.read(value, 1), 1);
                    },
                    "2 ab"),
                ElementsAre("writeChar wide 1", "readChar wide", "readChar wide", "ungetc wide 32",
                            "skipWhiteSpace 1", "readChar wide 2 2147483647"));
    EXPECT_EQ(value, L"ab");
}

TEST(IOSequence, ObjectsGoOutOnALineOfTheirOwn) {
    RecordingIO object;
    EXPECT_THAT(calls<QrTextStream>([&](QrStream& s) {
                    s << 1;
                    s << &object;
                    s << static_cast<const Mz::QrCastable*>(nullptr);
                    s << 2;
                }),
                ElementsAre("writeChar wide 1", "writeEol", "writeObject object null null",
                            "writeObject null null null", "writeChar wide 1"));
}

TEST(IOSequence, ObjectsAreReadWithTheArgumentsAsTheyAre) {
    const Mz::QrUid uid{77, 0, 0, 0};
    EXPECT_THAT(calls<QrBinaryStream>([&](QrStream& s) {
                    EXPECT_FALSE(s.readObject(&uid, L"first", L"second"));
                    EXPECT_FALSE(s.readObject(nullptr, nullptr, nullptr));
                }),
                ElementsAre("readObject 77 first second", "readObject null null null"));
}

TEST(IOSequence, LinesAreCountedByCharactersFromTheStart) {
    RecordingIO io("a\nb");
    QrTextStream stream(&io);
    wchar_t text[2];
    stream.formattedRead(L"%2c", text);
    io.calls.clear();
    EXPECT_EQ(stream.computeLineNb(), 2);
    EXPECT_THAT(io.calls, ElementsAre("tell", "seek 0 0", "readChar wide", "readChar wide"));
}

TEST(IOSequence, ALineAtTheBeginningIsCountedTheSameWay) {
    EXPECT_THAT(calls<QrTextStream>([](QrStream& s) { EXPECT_EQ(s.computeLineNb(), 1); }, "a"),
                ElementsAre("tell", "seek 0 0"));
}

TEST(IOSequence, AValueThatCannotBeFormattedTouchesNothing) {
    EXPECT_THAT(calls<QrTextStream>([](QrStream& s) {
                    s << 1;
                    EXPECT_THROW(s.formattedWrite(L"abc%"), QrStreamEx::ExWriteError);
                    s << 2;
                }),
                ElementsAre("writeChar wide 1", "writeSpace", "writeChar wide 1"));
}

} // namespace
