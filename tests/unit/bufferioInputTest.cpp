// SPDX-License-Identifier: BSL-1.0
// Tests reading, putting back, skipping and seeking with QrInBuffer in the "C" locale.
#include "components/componentManager/bufferio.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cwctype>
#include <sstream>
#include <string>

using namespace Mz;
using namespace std::string_literals;

namespace {

/// A QrInBuffer on a text.
class Input {
  public:
    explicit Input(const std::string& text) : stream(text), io(&stream) {}
    QrBufferedIO* operator->() { return &io; }

    /// Reads the rest, byte by byte.
    std::string rest() {
        std::string text;
        for (int byte = io.read(); byte != -1; byte = io.read())
            text += static_cast<char>(byte);
        return text;
    }

    std::istringstream stream;

  private:
    QrInBuffer io;
};

TEST(ReadByte, GivesUnsignedBytesAndMinusOneAtTheEndAsOftenAsAsked) {
    Input input("a\xFF\x80\0"s);
    EXPECT_EQ(input->read(), 'a');
    EXPECT_EQ(input->read(), 255);
    EXPECT_EQ(input->read(), 128);
    EXPECT_EQ(input->read(), 0);
    for (int again = 0; again < 3; ++again) {
        EXPECT_EQ(input->read(), -1);
        EXPECT_TRUE(input.stream.good()) << "the flags are cleared";
    }
}

TEST(ReadByte, GoesOnWhenMoreInputArrives) {
    std::stringstream stream;
    stream << "a";
    QrInBuffer io(&stream);
    EXPECT_EQ(io.read(), 'a');
    EXPECT_EQ(io.read(), -1);
    stream << "b";
    EXPECT_EQ(io.read(), 'b');
}

TEST(ReadBlock, ShorterThanAskedKeepsTheEndStateUntilTheNextByteRead) {
    Input input("abcd");
    char block[10] = "#########";
    EXPECT_EQ(input->read(block, 10), 4);
    EXPECT_EQ(std::string(block, 5), "abcd#");
    EXPECT_TRUE(input.stream.eof());
    EXPECT_TRUE(input.stream.fail());
    EXPECT_EQ(input->tell(), -1);
    EXPECT_FALSE(input->canSeek());
    EXPECT_EQ(input->read(block, 10), 0);
    EXPECT_EQ(input->tell(), -1);
    EXPECT_EQ(input->read(), -1);
    EXPECT_TRUE(input.stream.good());
    EXPECT_EQ(input->tell(), 4);
    EXPECT_TRUE(input->canSeek());
}

TEST(ReadBlock, OfExactlyAllLeavesTheStreamGood) {
    Input input("abcd");
    char block[4];
    EXPECT_EQ(input->read(block, 4), 4);
    EXPECT_TRUE(input.stream.good());
    EXPECT_EQ(input->tell(), 4);
}

TEST(ReadBlock, OfNothingOrLessReadsNothing) {
    Input input("abcd");
    char block[] = "#";
    for (const int size : {0, -1, -2147483647 - 1})
        EXPECT_EQ(input->read(block, size), 0);
    EXPECT_EQ(input->read(nullptr, 0), 0);
    EXPECT_EQ(block[0], '#');
    EXPECT_TRUE(input.stream.good());
    EXPECT_EQ(input.rest(), "abcd");
}

TEST(ReadBlock, SeesTheEndStateEndedByEveryCharacterRead) {
    const auto ends = [](auto&& read) {
        Input input("ab");
        char block[3];
        EXPECT_EQ(input->read(block, 3), 2);
        read(input);
        EXPECT_TRUE(input.stream.good());
        EXPECT_EQ(input->tell(), 2);
    };
    ends([](Input& input) { EXPECT_EQ(input->read(), -1); });
    ends([](Input& input) {
        char c = 'x';
        EXPECT_EQ(input->readChar(c), 0);
        EXPECT_EQ(c, 'x');
    });
    ends([](Input& input) {
        wchar_t c = L'x';
        EXPECT_EQ(input->readChar(c), 0);
        EXPECT_EQ(c, L'x');
    });
    ends([](Input& input) {
        char buffer[4];
        EXPECT_EQ(input->readChar(buffer, 4, 4), 0);
    });
    ends([](Input& input) {
        wchar_t buffer[4];
        EXPECT_EQ(input->readChar(buffer, 4, 4), 0);
    });
    ends([](Input& input) { input->skipWhiteSpace(1); });
}

TEST(ReadNarrowChar, ReadsOneByteWhateverItIs) {
    Input input("a\0\xFF"s);
    char c = 'x';
    EXPECT_EQ(input->readChar(c), 1);
    EXPECT_EQ(c, 'a');
    EXPECT_EQ(input->readChar(c), 1);
    EXPECT_EQ(c, '\0');
    EXPECT_EQ(input->readChar(c), 1);
    EXPECT_EQ(c, '\xFF');
    EXPECT_EQ(input->readChar(c), 0);
    EXPECT_EQ(c, '\xFF');
    EXPECT_TRUE(input.stream.good());
}

TEST(ReadNarrowArray, StopsAtTheCountOfCharacters) {
    Input input("abcdef");
    char buffer[10];
    EXPECT_EQ(input->readChar(buffer, 10, 3), 3);
    EXPECT_EQ(std::string(buffer, 3), "abc");
    EXPECT_EQ(input->read(), 'd');
}

TEST(ReadNarrowArray, StopsAtTheSizeInBytes) {
    Input input("abc");
    char buffer[3] = {'#', '#', '#'};
    EXPECT_EQ(input->readChar(buffer, 2, 5), 2);
    EXPECT_EQ(std::string(buffer, 3), "ab#");
    EXPECT_EQ(input.rest(), "c");
}

TEST(ReadNarrowArray, WithCountZeroOrSizeBelowOneReadsNothing) {
    Input input("abc");
    char buffer[] = "##";
    EXPECT_EQ(input->readChar(buffer, 2, 0), 0);
    EXPECT_EQ(input->readChar(buffer, 0, 2), 0);
    EXPECT_EQ(input->readChar(buffer, -1, 2), 0);
    EXPECT_EQ(input->readChar(buffer, -1, -1), 0);
    EXPECT_STREQ(buffer, "##");
    EXPECT_EQ(input.rest(), "abc");
}

TEST(ReadNarrowArray, WithANegativeCountHasOnlyTheSizeForALimit) {
    Input input("abcdef");
    char buffer[4];
    EXPECT_EQ(input->readChar(buffer, 4, -1), 4);
    EXPECT_EQ(std::string(buffer, 4), "abcd");
    EXPECT_EQ(input->readChar(buffer, 4, -1), 2);
    EXPECT_EQ(input->read(), -1);
}

TEST(ReadNarrowArray, WithANegativeCountEndsAtANul) {
    Input input("ab\0cd"s);
    char buffer[8];
    EXPECT_EQ(input->readChar(buffer, 8, -5), 2);
    EXPECT_EQ(input->read(), 0);
    EXPECT_EQ(input->read(), 'c');
}

TEST(ReadNarrowArray, WritesTheLowByteOfTheEndIntoTheNextSlot) {
    Input input("ab");
    char buffer[4] = {'#', '#', '#', '#'};
    EXPECT_EQ(input->readChar(buffer, 4, 4), 2);
    EXPECT_EQ(std::string(buffer, 4), "ab\xFF#");
    EXPECT_TRUE(input.stream.good());
}

TEST(ReadNarrowArray, StopsBeforeANulThatStaysUnread) {
    Input input("ab\0cd"s);
    char buffer[8];
    EXPECT_EQ(input->readChar(buffer, 8, 8), 2);
    EXPECT_EQ(input->readChar(buffer, 8, 8), 0);
    EXPECT_EQ(input.rest(), "\0cd"s);
}

TEST(ReadWideArray, ReadsTheSmallerOfSizeAndCount) {
    Input input("abcdef");
    wchar_t buffer[10];
    EXPECT_EQ(input->readChar(buffer, 10, 2), 2);
    EXPECT_EQ(std::wstring(buffer, 2), L"ab");
    EXPECT_EQ(input->readChar(buffer, 3, 10), 3);
    EXPECT_EQ(std::wstring(buffer, 3), L"cde");
    EXPECT_EQ(input->readChar(buffer, 10, 10), 1);
    EXPECT_EQ(buffer[0], L'f');
    EXPECT_EQ(input->readChar(buffer, 10, 10), 0);
    EXPECT_TRUE(input.stream.good());
}

TEST(ReadWideArray, OfNothingOrLessReadsNothing) {
    Input input("abc");
    wchar_t buffer[] = L"##";
    for (const auto& [size, count] : {std::pair(10, 0), {0, 10}, {-1, 10}, {10, -1}, {-3, -3}})
        EXPECT_EQ(input->readChar(buffer, size, count), 0);
    EXPECT_EQ(buffer[0], L'#');
    EXPECT_EQ(input.rest(), "abc");
}

TEST(ReadWideArray, FillsTheRestWithNulsThatStayUnread) {
    Input input("ab\0cd"s);
    wchar_t buffer[7] = {L'#', L'#', L'#', L'#', L'#', L'#', L'#'};
    EXPECT_EQ(input->readChar(buffer, 6, 6), 6);
    EXPECT_EQ(std::wstring(buffer, 7), std::wstring(L"ab\0\0\0\0#", 7));
    EXPECT_EQ(input->readChar(buffer, 1, 1), 1);
    EXPECT_EQ(buffer[0], L'\0');
    EXPECT_EQ(input.rest(), "\0cd"s);
}

TEST(ReadWideChar, GoesThroughTheArrayForm) {
    class Overriding : public QrInBuffer {
      public:
        using QrInBuffer::QrInBuffer;
        using QrInBuffer::readChar;
        int readChar(wchar_t* buf, int size, int count) override {
            EXPECT_EQ(size, 1);
            EXPECT_EQ(count, 1);
            *buf = L'!';
            return 77;
        }
    };
    std::istringstream stream("a");
    Overriding io(&stream);
    QrBufferedIO& base = io;
    wchar_t c = L'x';
    EXPECT_EQ(base.readChar(c), 77);
    EXPECT_EQ(c, L'!');
}

TEST(InTheCLocale, EveryByteIsTheCharacterOfItsCode) {
    std::string all;
    for (int byte = 1; byte < 256; ++byte)
        all += static_cast<char>(byte);
    Input input(all);
    wchar_t wide[255];
    ASSERT_EQ(input->readChar(wide, 255, 255), 255);
    for (int byte = 1; byte < 256; ++byte)
        EXPECT_EQ(static_cast<int>(wide[byte - 1]), byte);
    Input again(all);
    char narrow[256];
    ASSERT_EQ(again->readChar(narrow, 256, 1000), 255);
    EXPECT_EQ(std::string(narrow, 255), all);
    for (int byte = 255; byte > 0; --byte)
        input->ungetc(static_cast<wchar_t>(byte));
    EXPECT_EQ(input.rest(), all);
}

TEST(Ungetc, OfAWideCharacterAbove255IsAReadErrorInTheCLocale) {
    Input input("abc");
    EXPECT_EQ(input->read(), 'a');
    for (const unsigned int code : {0x100u, 0x20ACu, 0xFFFFu})
        EXPECT_THROW(input->ungetc(static_cast<wchar_t>(code)), QrStreamEx::ExReadError) << code;
    EXPECT_EQ(input.rest(), "bc");
}

TEST(Ungetc, PutsBackForTheNextRead) {
    std::stringstream stream("abc");
    QrInBuffer io(&stream);
    EXPECT_EQ(io.read(), 'a');
    EXPECT_EQ(io.read(), 'b');
    io.ungetc('y');
    io.ungetc(L'\xFF');
    EXPECT_EQ(io.read(), 0xFF);
    EXPECT_EQ(io.read(), 'y');
    EXPECT_EQ(io.read(), 'c');
    io.ungetc(L'\0');
    EXPECT_EQ(io.read(), 0);
}

TEST(Ungetc, BeforeTheBeginningIsNoticedByTheWideFormOnly) {
    Input input("abc");
    EXPECT_THROW(input->ungetc(L'x'), QrStreamEx::ExReadError);
    EXPECT_TRUE(input.stream.bad()) << "the stream keeps its state";
    Input narrow("abc");
    EXPECT_NO_THROW(narrow->ungetc('x'));
    EXPECT_TRUE(narrow.stream.bad());
    EXPECT_THROW(narrow->read(), QrStreamEx::ExReadError);
}

std::string afterSkip(const std::string& text, int count) {
    Input input(text);
    input->skipWhiteSpace(count);
    EXPECT_FALSE(input.stream.bad());
    return input.rest();
}

TEST(SkipWhiteSpace, SkipsAllWithinItsCount) {
    EXPECT_EQ(afterSkip("  \r\n\tx", 100), "x");
    EXPECT_EQ(afterSkip(" \t\n\v\fx", 100), "x");
    EXPECT_EQ(afterSkip("x ", 100), "x ");
    EXPECT_EQ(afterSkip("", 100), "");
    EXPECT_EQ(afterSkip("   ", 100), "");
}

TEST(SkipWhiteSpace, EndsWithALoneCarriageReturn) {
    EXPECT_EQ(afterSkip("\rx", 100), "x");
    EXPECT_EQ(afterSkip(" \r y", 100), " y");
    EXPECT_EQ(afterSkip("\r\r\n y", 100), "\r\n y");
    EXPECT_EQ(afterSkip("\r", 100), "");
    EXPECT_EQ(afterSkip("\r\xFFy", 100), "\xFFy");
}

TEST(SkipWhiteSpace, CountsAPairAsOne) {
    EXPECT_EQ(afterSkip("\r\n\r\n x", 1), "\r\n x");
    EXPECT_EQ(afterSkip("\r\n\r\n x", 2), " x");
    EXPECT_EQ(afterSkip("    x", 3), " x");
    EXPECT_EQ(afterSkip("\n\r\nx", 1), "\r\nx");
}

TEST(SkipWhiteSpace, OfNothingOrLessReadsNothing) {
    for (const int count : {0, -1, -2147483647 - 1})
        EXPECT_EQ(afterSkip("  x", count), "  x");
}

TEST(SkipWhiteSpace, TakesEveryByteAsASignedCharacter) {
    for (int byte = 0; byte < 256; ++byte) {
        if (byte == '\r')
            continue;
        const std::string text{static_cast<char>(byte), 'x'};
        const auto widened = static_cast<std::wint_t>(static_cast<signed char>(byte));
        EXPECT_EQ(afterSkip(text, 5), std::iswspace(widened) ? "x" : text) << byte;
        if (byte >= 0x80) {
            EXPECT_EQ(afterSkip(text, 5), text) << byte;
        }
    }
}

TEST(SkipWhiteSpace, LeavesTheStreamGoodAtTheEnd) {
    for (const char* text : {"", "  ", "\r", "\r\n"}) {
        Input input(text);
        input->skipWhiteSpace(10);
        EXPECT_TRUE(input.stream.good());
        EXPECT_EQ(input->tell(), static_cast<int64>(std::string(text).size()));
    }
}

TEST(InputPosition, IsToldAndSought) {
    Input input("abcdef");
    EXPECT_EQ(input->tell(), 0);
    EXPECT_TRUE(input->canSeek());
    EXPECT_EQ(input->seek(4, 0), 4);
    EXPECT_EQ(input->read(), 'e');
    EXPECT_EQ(input->seek(-2, 1), 3);
    EXPECT_EQ(input->read(), 'd');
    EXPECT_EQ(input->seek(-1, 2), 5);
    EXPECT_EQ(input->read(), 'f');
    EXPECT_EQ(input->seek(0, 2), 6);
    EXPECT_EQ(input->seek(0, 1), 6);
    EXPECT_EQ(input->seek(0, 0), 0);
    EXPECT_EQ(input.rest(), "abcdef");
}

TEST(InputSeek, OutOfReachIsAReadErrorAndKeepsTheFailbit) {
    Input input("abcdef");
    EXPECT_THROW(input->seek(7, 0), QrStreamEx::ExReadError);
    EXPECT_EQ(input.stream.rdstate(), std::ios::failbit);
    EXPECT_EQ(input->tell(), -1);
    EXPECT_EQ(input->seek(0, 1), -1);
    EXPECT_THROW(input->seek(0, 0), QrStreamEx::ExReadError);
    EXPECT_EQ(input->read(), -1) << "a failed stream reads as the end of input once";
    EXPECT_EQ(input->read(), 'a');
    EXPECT_THROW(input->seek(-1, 0), QrStreamEx::ExReadError);
}

TEST(InputSeek, ToAnotherOriginIsAReadErrorAndTouchesNothing) {
    Input input("abcdef");
    for (const int origin : {-1, 3, 4, 2147483647, -2147483647 - 1})
        EXPECT_THROW(input->seek(1, origin), QrStreamEx::ExReadError);
    EXPECT_TRUE(input.stream.good());
    EXPECT_EQ(input->tell(), 0);
}

// ---- Streams whose failbit is set -----------------------------------------------------------

class FailedSeek : public testing::Test {
  protected:
    FailedSeek() : input("abc") {
        EXPECT_EQ(input->read(), 'a');
        EXPECT_THROW(input->seek(100, 0), QrStreamEx::ExReadError);
        EXPECT_EQ(input.stream.rdstate(), std::ios::failbit);
    }
    ~FailedSeek() override {
        EXPECT_TRUE(input.stream.good());
        EXPECT_EQ(input.rest(), "bc");
    }
    Input input;
};

TEST_F(FailedSeek, CountsAsTheEndForAByte) {
    EXPECT_EQ(input->read(), -1);
}

TEST_F(FailedSeek, CountsAsTheEndForANarrowCharacter) {
    char c = 'x';
    EXPECT_EQ(input->readChar(c), 0);
    EXPECT_EQ(c, 'x');
}

TEST_F(FailedSeek, CountsAsTheEndForAWideCharacter) {
    wchar_t c = L'x';
    EXPECT_EQ(input->readChar(c), 0);
    EXPECT_EQ(c, L'x');
}

TEST_F(FailedSeek, CountsAsTheEndForTheArrays) {
    char narrow[4];
    EXPECT_EQ(input->readChar(narrow, 4, 4), 0);
    EXPECT_THROW(input->seek(100, 0), QrStreamEx::ExReadError);
    wchar_t wide[4];
    EXPECT_EQ(input->readChar(wide, 4, 4), 0);
}

TEST_F(FailedSeek, CountsAsTheEndForTheSkip) {
    input->skipWhiteSpace(3);
}

TEST_F(FailedSeek, CountsAsTheEndForABlockWhichLeavesTheState) {
    char block[2] = {'#', '#'};
    EXPECT_EQ(input->read(block, 2), 0);
    EXPECT_EQ(block[0], '#');
    EXPECT_TRUE(input.stream.fail());
    EXPECT_EQ(input->read(), -1);
}

TEST(ShortBlockThenPutBack, NeverGivesAStaleByte) {
    Input input("abc");
    char block[10];
    EXPECT_EQ(input->read(block, 10), 3);
    input->ungetc('c'); // Clears the eofbit but not the failbit.
    EXPECT_EQ(input.stream.rdstate(), std::ios::failbit);
    char c = 'x';
    EXPECT_EQ(input->readChar(c), 0);
    EXPECT_EQ(c, 'x');
    EXPECT_TRUE(input.stream.good());
    EXPECT_EQ(input->read(), -1);
    EXPECT_EQ(input->read(block, 10), 0);
    EXPECT_NO_THROW(input->ungetc(L'c'));
    EXPECT_EQ(input->read(), -1);
    input->ungetc(L'c');
    EXPECT_EQ(input->read(), 'c');
}

/// A text whose reads a caller can observe.
class ForeignText final : public std::stringbuf {
  public:
    using std::stringbuf::stringbuf;
};

TEST(HeldBytes, AreThoseThatCanBeReadWithoutTheMedium) {
    std::istringstream text("abc");
    QrInBuffer io(&text);
    EXPECT_EQ(io.heldBytes(), 3);
    EXPECT_EQ(io.read(), 'a');
    EXPECT_EQ(io.heldBytes(), 2);
    EXPECT_EQ(text.tellg(), 1);
    EXPECT_EQ(io.read(), 'b');
    EXPECT_EQ(io.read(), 'c');
    EXPECT_EQ(io.heldBytes(), 0);
}

TEST(HeldBytes, AreNotKnownIfAReadDoesMore) {
    std::ostringstream other;
    std::istringstream text("abc");
    const QrInBuffer io(&text);
    text.tie(&other);
    EXPECT_LT(io.heldBytes(), 0);
    text.tie(nullptr);
    text.setf(std::ios::unitbuf);
    EXPECT_LT(io.heldBytes(), 0);
    text.unsetf(std::ios::unitbuf);
    EXPECT_EQ(io.heldBytes(), 3);
    text.setstate(std::ios::eofbit);
    EXPECT_LT(io.heldBytes(), 0);

    ForeignText foreign("abc");
    std::istream stream(&foreign);
    EXPECT_LT(QrInBuffer(&stream).heldBytes(), 0);
}

} // namespace
