// SPDX-License-Identifier: BSL-1.0
// Tests writing and seeking with QrOutBuffer in the "C" locale, media without positions, and
// streams whose badbit is set.
#include "components/componentManager/bufferio.h"

#include <gtest/gtest.h>

#include <sstream>
#include <string>

using namespace Mz;
using namespace std::string_literals;

namespace {

class Output {
  public:
    Output() : io(&stream) {}
    QrBufferedIO* operator->() { return &io; }
    std::string text() const { return stream.str(); }

    std::ostringstream stream;

  private:
    QrOutBuffer io;
};

TEST(Write, WritesBytesAndBlocksAsTheyAre) {
    Output output;
    output->write('a');
    output->write('\0');
    output->write("\r\n\xFF", 3);
    EXPECT_EQ(output.text(), "a\0\r\n\xFF"s);
}

TEST(Write, OfNothingOrLessWritesNothing) {
    Output output;
    output->write("abc", 0);
    output->write("abc", -1);
    output->write(nullptr, 0);
    output->writeChar(L"abc", 0);
    output->writeChar(L"abc", -1);
    EXPECT_EQ(output->writeChar("abc", 0), 0);
    EXPECT_EQ(output->writeChar("abc", -1), 0);
    EXPECT_EQ(output.text(), "");
    EXPECT_TRUE(output.stream.good());
}

TEST(WriteEol, IsOneLineFeedAndWriteSpaceOneSpace) {
    Output output;
    output->writeEol();
    EXPECT_EQ(output.text(), "\n");
    output->writeSpace();
    EXPECT_EQ(output.text(), "\n ");
}

TEST(WriteNarrowArray, CountsANulAsACharacter) {
    Output output;
    EXPECT_EQ(output->writeChar("ab\0c", 4), 4);
    EXPECT_EQ(output.text(), "ab\0c"s);
}

TEST(WriteNarrow, TakesEveryByteInTheCLocale) {
    Output output;
    std::string all;
    for (int byte = 0; byte < 256; ++byte)
        all += static_cast<char>(byte);
    EXPECT_EQ(output->writeChar(all.data(), 256), 256);
    EXPECT_EQ(output.text(), all);
    Output single;
    for (const char byte : all)
        single->writeChar(byte);
    EXPECT_EQ(single.text(), all);
}

TEST(WriteWide, WritesCodesUpTo255AsBytesInTheCLocale) {
    Output output;
    std::string all;
    std::wstring wide;
    for (int byte = 0; byte < 256; ++byte) {
        all += static_cast<char>(byte);
        wide += static_cast<wchar_t>(byte);
    }
    EXPECT_EQ(output->writeChar(wide.data(), 256), 256);
    EXPECT_EQ(output.text(), all);
    Output single;
    for (const wchar_t c : wide)
        single->writeChar(c);
    EXPECT_EQ(single.text(), all);
}

TEST(WriteWide, OfALargerCodeIsAWriteErrorInTheCLocale) {
    Output output;
    for (const unsigned int code : {0x100u, 0x20ACu, 0xD800u, 0xFFFFu}) {
        EXPECT_THROW(output->writeChar(static_cast<wchar_t>(code)), QrStreamEx::ExWriteError);
        const wchar_t text[] = {L'a', L'b', static_cast<wchar_t>(code), L'c'};
        EXPECT_THROW(output->writeChar(text, 4), QrStreamEx::ExWriteError);
    }
    EXPECT_EQ(output.text(), "abababab") << "the characters before it are written";
}

TEST(OutputPosition, IsToldAndSought) {
    Output output;
    EXPECT_TRUE(output->canSeek());
    output->write("abcdef", 6);
    EXPECT_EQ(output->tell(), 6);
    EXPECT_EQ(output->seek(1, 0), 1);
    output->write('B');
    EXPECT_EQ(output->seek(1, 1), 3);
    output->write('D');
    EXPECT_EQ(output->seek(-1, 2), 5);
    output->write('F');
    EXPECT_EQ(output->seek(0, 1), 6);
    EXPECT_EQ(output->seek(0, 0), 0);
    output->write('A');
    EXPECT_EQ(output->seek(0, 1), 1);
    EXPECT_EQ(output->seek(0, 2), 6);
    EXPECT_EQ(output.text(), "ABcDeF");
}

TEST(OutputSeek, OutOfReachIsAWriteErrorAndKeepsTheFailbit) {
    Output output;
    output->write("abc", 3);
    EXPECT_THROW(output->seek(100, 0), QrStreamEx::ExWriteError);
    EXPECT_EQ(output.stream.rdstate(), std::ios::failbit);
    EXPECT_EQ(output->tell(), -1);
    EXPECT_FALSE(output->canSeek());
    EXPECT_EQ(output->seek(0, 1), -1);
}

TEST(OutputSeek, ToAnotherOriginIsAWriteErrorAndTouchesNothing) {
    Output output;
    for (const int origin : {-1, 3, 2147483647})
        for (const int offset : {0, 1})
            EXPECT_THROW(output->seek(offset, origin), QrStreamEx::ExWriteError);
    EXPECT_TRUE(output.stream.good());
}

/// A medium that cannot seek.
class Pipe : public std::streambuf {
  public:
    explicit Pipe(std::string text) : text(std::move(text)) {
        setg(this->text.data(), this->text.data(), this->text.data() + this->text.size());
    }

  protected:
    int_type overflow(int_type byte) override { return traits_type::not_eof(byte); }

  private:
    std::string text;
};

TEST(Pipes, CannotTellAndCannotSeek) {
    Pipe pipe("abc");
    std::istream input(&pipe);
    QrInBuffer in(&input);
    EXPECT_EQ(in.tell(), -1);
    EXPECT_FALSE(in.canSeek());
    EXPECT_EQ(in.seek(0, 1), -1);
    EXPECT_TRUE(input.good());
    EXPECT_EQ(in.read(), 'a');
    EXPECT_THROW(in.seek(5, 0), QrStreamEx::ExReadError);
    std::ostream output(&pipe);
    QrOutBuffer out(&output);
    EXPECT_EQ(out.tell(), -1);
    EXPECT_FALSE(out.canSeek());
    EXPECT_EQ(out.seek(0, 1), -1);
    EXPECT_TRUE(output.good());
    out.write('x');
    EXPECT_THROW(out.seek(5, 0), QrStreamEx::ExWriteError);
    output.clear();
    EXPECT_THROW(out.seek(0, 0), QrStreamEx::ExWriteError);
}

TEST(BadOutput, IsAWriteErrorForAllButTheLineEndAndTheSpace) {
    std::ostream stream(nullptr);
    QrOutBuffer out(&stream);
    ASSERT_TRUE(stream.bad());
    EXPECT_THROW(out.write('x'), QrStreamEx::ExWriteError);
    EXPECT_THROW(out.write("x", 1), QrStreamEx::ExWriteError);
    EXPECT_THROW(out.write("x", 0), QrStreamEx::ExWriteError);
    EXPECT_THROW(out.writeChar('x'), QrStreamEx::ExWriteError);
    EXPECT_THROW(out.writeChar(L'x'), QrStreamEx::ExWriteError);
    EXPECT_THROW(out.writeChar("x", 1), QrStreamEx::ExWriteError);
    EXPECT_THROW(out.writeChar(L"x", 1), QrStreamEx::ExWriteError);
    EXPECT_NO_THROW(out.writeEol());
    EXPECT_NO_THROW(out.writeSpace());
    EXPECT_EQ(out.tell(), -1);
}

TEST(BadInput, IsAReadErrorForAllButTheNarrowPutBack) {
    std::istream stream(nullptr);
    QrInBuffer in(&stream);
    char narrow[2];
    wchar_t wide[2];
    EXPECT_THROW(in.read(), QrStreamEx::ExReadError);
    EXPECT_THROW(in.read(narrow, 2), QrStreamEx::ExReadError);
    EXPECT_THROW(in.readChar(narrow[0]), QrStreamEx::ExReadError);
    EXPECT_THROW(in.readChar(wide[0]), QrStreamEx::ExReadError);
    EXPECT_THROW(in.readChar(narrow, 2, 2), QrStreamEx::ExReadError);
    EXPECT_THROW(in.readChar(wide, 2, 2), QrStreamEx::ExReadError);
    EXPECT_THROW(in.skipWhiteSpace(1), QrStreamEx::ExReadError);
    EXPECT_THROW(in.ungetc(L'x'), QrStreamEx::ExReadError);
    EXPECT_NO_THROW(in.ungetc('x'));
    EXPECT_EQ(in.readChar(narrow, 2, 0), 0) << "a count of 0 is a no-op";
    EXPECT_EQ(in.readChar(wide, 0, 2), 0);
    EXPECT_NO_THROW(in.skipWhiteSpace(0));
    EXPECT_EQ(in.tell(), -1);
}

} // namespace
