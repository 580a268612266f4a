// SPDX-License-Identifier: BSL-1.0
// Tests the layout of text: separators, lines, columns, bools and strings, what is read back, and
// line numbers.
#include "tests/streams/recordingIO.h"
#include "tests/streams/support.h"

#include "components/componentManager/text/characterCount.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <limits>
#include <utility>

namespace {

using namespace Mz::Test;
using Mz::QrBinaryStream;
using Mz::QrStream;
using Mz::QrStreamEx;
using Mz::QrTextStream;

template <class Work>
std::string text(Work&& write) {
    return written<QrTextStream>(write);
}

TEST(TextLayout, ValuesAreSeparatedByBlanksAndNothingFollowsTheLast) {
    EXPECT_EQ(text([](QrStream& s) { s << 1 << 2 << 3; }), "1 2 3");
    EXPECT_EQ(text([](QrStream& s) { s << 1; }), "1");
}

/// Returns the last two characters of a line of `length` characters, and what follows.
std::string afterLineOf(int length) {
    return text([&](QrStream& s) {
               s.formattedWrite(L"%0*d", length - 2, 7);
               s << false << 8; // No separator follows a bool. The line is now full.
               s << 9;
           })
        .substr(static_cast<std::size_t>(length - 2));
}

TEST(TextLayout, ASeparatorIsABlankUpToColumn70AndALineEndBeyond) {
    EXPECT_EQ(afterLineOf(69), "08 9");
    EXPECT_EQ(afterLineOf(70), "08 9");
    EXPECT_EQ(afterLineOf(71), "08\n9");
    EXPECT_EQ(afterLineOf(200), "08\n9");
}

TEST(TextLayout, TheColumnStartsAgainAfterALineEnd) {
    const std::string lines = text([](QrStream& s) {
        for (int index = 0; index < 100; ++index)
            s << 1234567;
    });
    // A line has nine values and eight blanks: 71 characters.
    std::istringstream split(lines);
    std::string line;
    int count = 0;
    for (; count < 11 && std::getline(split, line); ++count)
        EXPECT_EQ(line.size(), 71U);
    ASSERT_TRUE(std::getline(split, line));
    EXPECT_EQ(line, "1234567");
    EXPECT_FALSE(std::getline(split, line));
    EXPECT_EQ(lines.back(), '7');
}

TEST(TextLayout, TheBlankCountsAsACharacterOfTheLine) {
    const std::string lines = text([](QrStream& s) {
        for (int index = 0; index < 37; ++index)
            s << 1;
    });
    // A line has 36 digits and 35 blanks: 71 characters.
    EXPECT_EQ(lines.find('\n'), 71U);
    EXPECT_EQ(lines.size(), 73U);
}

TEST(TextLayout, ALongValueIsNotSplit) {
    const std::string digits(300, '0');
    EXPECT_EQ(text([](QrStream& s) {
                  s << 1;
                  s.formattedWrite(L"%0300d", 0);
              }),
              "1 " + digits);
}

TEST(TextLayout, ABoolLeavesNoSeparatorBehindIt) {
    const std::string bytes = text([](QrStream& s) { s << true << 5; });
    EXPECT_EQ(bytes, "15");
    Reading<QrTextStream> in(bytes);
    bool flag = false;
    int number = 0;
    in.stream >> flag >> number;
    EXPECT_TRUE(flag);
    EXPECT_EQ(number, 5);
}

TEST(TextLayout, ABoolWritesTheSeparatorThatIsDueBeforeIt) {
    EXPECT_EQ(text([](QrStream& s) { s << 5 << true << false << 7 << true; }), "5 107 1");
}

TEST(TextLayout, ABoolCountsInTheColumn) {
    EXPECT_EQ(text([](QrStream& s) {
                  for (int index = 0; index < 70; ++index)
                      s << true;
                  s << 2 << 3;
              }),
              std::string(70, '1') + "2\n3");
}

TEST(TextLayout, EveryCharacterButZeroReadsAsTrue) {
    for (const char character : {'1', '2', ' ', 'x', '\n', '\xFF'}) {
        Reading<QrTextStream> in({&character, 1});
        bool flag = false;
        in.stream >> flag;
        EXPECT_TRUE(flag) << static_cast<int>(character);
    }
    Reading<QrTextStream> in("0");
    bool flag = true;
    in.stream >> flag;
    EXPECT_FALSE(flag);
    EXPECT_THROW(in.stream >> flag, QrStreamEx::ExReadError);
}

TEST(TextLayout, ABoolAfterANumberReadsTheBlankBetweenThem) {
    // Reading a number leaves no separator to skip, so the bool reads the blank.
    Reading<QrTextStream> in("5 0");
    int number = 0;
    bool flag = false;
    in.stream >> number >> flag;
    EXPECT_EQ(number, 5);
    EXPECT_TRUE(flag);
    EXPECT_EQ(in.rest(), "0");
}

TEST(TextLayout, AStringIsItsLengthASeparatorAndItsCharacters) {
    EXPECT_EQ(text([](QrStream& s) { s << std::wstring(L"a b"); }), "3 a b");
    EXPECT_EQ(text([](QrStream& s) { s << std::wstring(); }), "0 ");
    EXPECT_EQ(text([](QrStream& s) { s << std::wstring(L"\n") << 4; }), "1 \n4");
}

TEST(TextLayout, AStringReadsBackShiftedByItsSeparator) {
    for (const bool counted : {false, true}) {
        Reading<QrTextStream> in("3 a b");
        std::wstring value;
        if (counted)
            EXPECT_EQ(in.stream.read(value, 1), 1);
        else
            in.stream >> value;
        EXPECT_EQ(value, L" a ");
        EXPECT_EQ(in.rest(), "b");
    }
    Reading<QrTextStream> broken("3\na b");
    std::wstring value;
    broken.stream >> value;
    EXPECT_EQ(value, L"\na ");
}

TEST(TextLayout, TheLengthOfAStringEndsALineLikeAnyValue) {
    EXPECT_EQ(text([](QrStream& s) {
                  s.formattedWrite(L"%070d", 0);
                  s << std::wstring(L"ab") << 1;
              }),
              std::string(70, '0') + "2\nab1");
    EXPECT_EQ(text([](QrStream& s) {
                  s.formattedWrite(L"%069d", 0);
                  s << std::wstring(L"ab") << 1 << 2;
              }),
              std::string(69, '0') + "2 ab1\n2");
}

TEST(TextLayout, AStringCountsInTheColumnByItsCharacters) {
    EXPECT_EQ(text([](QrStream& s) { s << std::wstring(66, L'x') << 1 << 2; }),
              "66 " + std::string(66, 'x') + "1 2");
    EXPECT_EQ(text([](QrStream& s) { s << std::wstring(67, L'x') << 1 << 2; }),
              "67 " + std::string(67, 'x') + "1\n2");
}

TEST(TextLayout, AShortStringRaisesReadErrorNamedAfterTheReader) {
    Reading<QrTextStream> single("3 a");
    std::wstring value;
    try {
        single.stream >> value;
        FAIL();
    } catch (const QrStreamEx::ExReadError& error) {
        EXPECT_STREQ(error.getReason(), "Error reading stream.");
        EXPECT_EQ(
            std::string(error.getDetailedReason()).find("components/componentManager/stream("), 0U);
    }
    Reading<QrTextStream> counted("3 a");
    try {
        counted.stream.read(value, 1);
        FAIL();
    } catch (const QrStreamEx::ExReadError& error) {
        EXPECT_EQ(
            std::string(error.getDetailedReason()).find("components/componentManager/textStream("),
            0U);
    }
}

TEST(TextLayout, CountedTextIsThatOfSingleValues) {
    const int numbers[] = {1, 2, 3};
    EXPECT_EQ(text([&](QrStream& s) { s.write(numbers[0], 3); }), "1 2 3");
    const bool flags[] = {true, false, true};
    const std::string bytes = text([&](QrStream& s) { s.write(flags[0], 3); });
    EXPECT_EQ(bytes, "101");
    Reading<QrTextStream> in(bytes);
    bool read[3] = {false, true, false};
    EXPECT_EQ(in.stream.read(read[0], 3), 3);
    EXPECT_TRUE(read[0]);
    EXPECT_FALSE(read[1]);
    EXPECT_TRUE(read[2]);
    EXPECT_EQ(in.stream.read(read[0], 3), 0);
}

TEST(TextLayout, CountsBelowOneWriteAndReadNothing) {
    for (const int count : {0, -1, -2147483647}) {
        const int numbers[] = {1};
        const std::wstring strings[] = {L"a"};
        EXPECT_EQ(text([&](QrStream& s) {
                      s << 1;
                      s.write(numbers[0], count);
                      s.write(strings[0], count);
                  }),
                  "1");
        Reading<QrTextStream> in("1 2");
        int number = 9;
        bool flag = false;
        std::wstring string = L"kept";
        EXPECT_EQ(in.stream.read(number, count), 0);
        EXPECT_EQ(in.stream.read(flag, count), 0);
        EXPECT_EQ(in.stream.read(string, count), 0);
        EXPECT_EQ(number, 9);
        EXPECT_EQ(string, L"kept");
        EXPECT_EQ(in.rest(), "1 2");
    }
}

TEST(TextLayout, CountedReadsStopAtTheFirstValueThatIsNone) {
    Reading<QrTextStream> in("7 8 x");
    int numbers[3] = {1, 2, 3};
    EXPECT_EQ(in.stream.read(numbers[0], 3), 2);
    EXPECT_EQ(numbers[0], 7);
    EXPECT_EQ(numbers[1], 8);
    EXPECT_EQ(numbers[2], 3);
    EXPECT_EQ(in.rest(), "x");
}

TEST(TextLayout, CountedStringsStopWhereTheLengthIsMissing) {
    Reading<QrTextStream> in("1 a2 x");
    std::wstring strings[3];
    // The separator is read as a character: the first string is " ". The "a" is not a length.
    EXPECT_EQ(in.stream.read(strings[0], 3), 1);
    EXPECT_EQ(strings[0], L" ");
    EXPECT_EQ(in.rest(), "a2 x");
}

template <class T>
void expectUnreadable(const char* bytes) {
    Reading<QrTextStream> in(bytes);
    T value{};
    EXPECT_THROW(in.stream >> value, QrStreamEx::ExReadError);
    EXPECT_EQ(value, T{});
    EXPECT_EQ(in.stream.read(value, 1), 0);
}

TEST(TextLayout, ASingleValueThatIsNotThereRaisesReadError) {
    for (const char* bytes : {"", "   ", "x", "+", ".", "-x"}) {
        SCOPED_TRACE(bytes);
        expectUnreadable<char>(bytes);
        expectUnreadable<unsigned char>(bytes);
        expectUnreadable<short>(bytes);
        expectUnreadable<unsigned short>(bytes);
        expectUnreadable<int>(bytes);
        expectUnreadable<unsigned int>(bytes);
        expectUnreadable<long>(bytes);
        expectUnreadable<unsigned long>(bytes);
        expectUnreadable<Mz::int64>(bytes);
        expectUnreadable<unsigned long long>(bytes);
        expectUnreadable<float>(bytes);
        expectUnreadable<double>(bytes);
    }
}

TEST(TextLayout, NarrowTypesKeepTheLowBitsOfTheNumber) {
    Reading<QrTextStream> in("-1 300 65 65537 -65537 4294967297 -1 18446744073709551617");
    char character = 0;
    unsigned char byte = 0;
    char letter = 0;
    unsigned short number = 0;
    short negative = 0;
    int wrapped = 0;
    unsigned long all = 0;
    unsigned long long one = 0;
    in.stream >> character >> byte >> letter >> number >> negative >> wrapped >> all >> one;
    EXPECT_EQ(character, static_cast<char>(-1));
    EXPECT_EQ(byte, 300 - 256);
    EXPECT_EQ(letter, 'A');
    EXPECT_EQ(number, 1);
    EXPECT_EQ(negative, -1);
    EXPECT_EQ(wrapped, 1);
    EXPECT_EQ(all, 0xFFFFFFFFUL);
    EXPECT_EQ(one, 1U);
}

template <class Stream>
void expectUnreadableCharacter() {
    for (const char* bytes : {"65", " 65", "w", "", "\n\t x", "A"}) {
        SCOPED_TRACE(bytes);
        Reading<Stream> in(bytes);
        wchar_t character = L'?';
        EXPECT_THROW(in.stream >> character, QrStreamEx::ExReadError);
        EXPECT_EQ(character, L'?');
        // White space is skipped. The rest stays unread.
        std::string left(bytes);
        left.erase(0, left.find_first_not_of(" \n\t"));
        EXPECT_EQ(in.rest(), left);
    }
}

TEST(TextLayout, ACharacterCanBeReadByNoStream) {
    expectUnreadableCharacter<QrTextStream>();
    expectUnreadableCharacter<QrBinaryStream>();
    expectUnreadableCharacter<BaseStream>();
}

TEST(TextLayout, BinaryDataAfterTextBeginsANewLine) {
    const int number = 1;
    EXPECT_EQ(toHex(written<BaseStream>([&](QrStream& s) {
                  s << 7;
                  s.write(number, 1);
              })),
              "37 0A 00 00 00 01");
    EXPECT_EQ(toHex(written<QrBinaryStream>([](QrStream& s) { s << wchar_t(65) << 1; })),
              "36 35 0A 00 00 00 01");
    EXPECT_EQ(toHex(written<QrBinaryStream>([](QrStream& s) { s << wchar_t(65) << wchar_t(66); })),
              "36 35 20 36 36");
}

TEST(TextLayout, TextAfterBinaryDataBeginsAtColumnZeroWithoutASeparator) {
    const int number = 0x41414141;
    EXPECT_EQ(written<BaseStream>([&](QrStream& s) {
                  s.formattedWrite(L"%070d", 0);
                  s << 1;
                  s.write(number, 1);
                  s << 2 << 3;
              }),
              std::string(70, '0') + "1\nAAAA2 3");
}

TEST(TextLayout, NoBinaryDataEndsNoText) {
    for (const int count : {0, -1}) {
        const int number = 1;
        EXPECT_EQ(written<BaseStream>([&](QrStream& s) {
                      s << 7;
                      s.write(number, count);
                      s.write(true, count);
                      s << 8;
                  }),
                  "7 8");
    }
}

TEST(TextLayout, NoBinaryDataThatIsReadSkipsNoSeparator) {
    RecordingIO io(std::string("\n\0\0\0\1", 5));
    BaseStream stream(&io);
    stream << 7;
    io.calls.clear();
    int number = 5;
    bool flag = true;
    for (const int count : {0, -1}) {
        EXPECT_EQ(stream.read(number, count), 0);
        EXPECT_EQ(stream.read(flag, count), 0);
    }
    EXPECT_EQ(std::count(io.calls.begin(), io.calls.end(), "skipWhiteSpace 1"), 0);
    EXPECT_EQ(stream.read(number, 1), 1);
    EXPECT_EQ(number, 1);
    EXPECT_EQ(std::count(io.calls.begin(), io.calls.end(), "skipWhiteSpace 1"), 1);
}

TEST(TextLayout, FormattedTextMakesNoSeparatorDue) {
    EXPECT_EQ(text([](QrStream& s) {
                  EXPECT_EQ(s.formattedWrite(L"a%db", 1), 3);
                  s << 2;
                  EXPECT_EQ(s.formattedWrite(L"%d", 34), 2);
                  s << 5;
              }),
              "a1b2 345");
}

/// An IO that reports a false number of written characters.
class ClaimingOutput final : public Mz::QrOutBuffer {
  public:
    using Mz::QrOutBuffer::QrOutBuffer;
    using Mz::QrOutBuffer::writeChar;
    int writeChar(const wchar_t* text, int count) override {
        Mz::QrOutBuffer::writeChar(text, count);
        return claim == 0 ? count : claim;
    }

    int claim = 0;
};

/// Expects `wanted` after one to six values for each of which the IO reports `claim` characters.
template <class Work>
void expectAfterClaiming(int claim, const std::string& wanted, const Work& work) {
    for (int values = 1; values <= 6; ++values) {
        SCOPED_TRACE(testing::Message() << values << " times " << claim);
        std::ostringstream sink;
        ClaimingOutput io(&sink);
        QrTextStream stream(&io);
        io.claim = claim;
        for (int index = 0; index < values; ++index)
            work(stream);
        io.claim = 0;
        sink.str({});
        stream << true << 5 << 6;
        EXPECT_EQ(sink.str(), wanted);
    }
}

TEST(TextLayout, ALineThatIsLongerThanAnIntCountsIsALongLine) {
    constexpr int half = 1 << 30;
    const auto formatted = [](QrStream& s) { s.formattedWrite(L"%s", L"x"); };
    const auto number = [](QrStream& s) { s.formattedWrite(L"%d", 1); };
    const auto flag = [](QrStream& s) { s << true; };
    // Its length is written as a number, so the IO reports `claim` for it.
    const auto string = [](QrStream& s) { s << std::wstring(L"x"); };
    for (const int claim : {half, 0x7fffffff}) {
        expectAfterClaiming(claim, "15\n6", formatted);
        expectAfterClaiming(claim, "15\n6", number);
        expectAfterClaiming(claim, "15\n6", flag);
        expectAfterClaiming(claim, "15\n6", string);
    }
    // A negative report has no effect.
    expectAfterClaiming(-half, "15 6", formatted);
}

TEST(CharacterCount, StaysAtItsLimits) {
    constexpr int largest = std::numeric_limits<int>::max();
    constexpr int smallest = std::numeric_limits<int>::min();
    EXPECT_EQ(Mz::addCharacters(2, 3), 5);
    EXPECT_EQ(Mz::addCharacters(largest - 1, 1), largest);
    EXPECT_EQ(Mz::addCharacters(largest, 1), largest);
    EXPECT_EQ(Mz::addCharacters(largest, largest), largest);
    EXPECT_EQ(Mz::addCharacters(largest, -1), largest - 1);
    EXPECT_EQ(Mz::addCharacters(smallest, -1), smallest);
    EXPECT_EQ(Mz::addCharacters(-5, smallest), smallest);
}

TEST(TextLayout, LinesAreCountedFromTheBeginning) {
    Reading<QrTextStream> in("1 2\n3\n\n4 5");
    EXPECT_EQ(in.stream.computeLineNb(), 1);
    int numbers[5];
    ASSERT_EQ(in.stream.read(numbers[0], 3), 3);
    EXPECT_EQ(in.stream.computeLineNb(), 2);
    ASSERT_EQ(in.stream.read(numbers[0], 1), 1);
    EXPECT_EQ(numbers[0], 4);
    EXPECT_EQ(in.stream.computeLineNb(), 4);
    // The position is unchanged.
    ASSERT_EQ(in.stream.read(numbers[0], 1), 1);
    EXPECT_EQ(numbers[0], 5);
}

/// An input that claims a position beyond its end.
class ClaimingInput final : public Mz::QrInBuffer {
  public:
    using Mz::QrInBuffer::QrInBuffer;
    Mz::int64 tell() const override { return 1000; }
};

TEST(TextLayout, LinesAreCountedToTheEndAtMost) {
    for (const auto& [content, lines] :
         {std::pair("a\nb\nc", 3), std::pair("a\nb\n", 3), std::pair("", 1)}) {
        std::istringstream source(content);
        ClaimingInput io(&source);
        QrTextStream stream(&io);
        EXPECT_EQ(stream.computeLineNb(), lines) << content;
    }
}

TEST(TextLayout, TheLineIsOneWhereThePositionIsUnknown) {
    Reading<QrTextStream> in("1\n2");
    int number = 0;
    in.stream >> number >> number;
    in.source.setstate(std::ios::failbit);
    EXPECT_EQ(in.stream.computeLineNb(), 1);
}

TEST(TextLayout, OnlyWritingKnowsItsKind) {
    Writing<QrTextStream> textual;
    EXPECT_TRUE(textual.stream.isTextStream());
    EXPECT_FALSE(textual.stream.isBinaryStream());
    Writing<QrBinaryStream> binary;
    EXPECT_FALSE(binary.stream.isTextStream());
    EXPECT_TRUE(binary.stream.isBinaryStream());
    Writing<BaseStream> base;
    EXPECT_FALSE(base.stream.isTextStream());
    EXPECT_FALSE(base.stream.isBinaryStream());
}

} // namespace
