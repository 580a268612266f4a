// SPDX-License-Identifier: BSL-1.0
// Tests streams in a locale whose decimal separator is a comma, and that they restore the locale.
#include "tests/streams/commaLocale.h"
#include "tests/streams/recordingIO.h"
#include "tests/streams/support.h"

#include "components/componentManager/text/plainBytes.h"
#include "components/platform/characters.h"
#include "components/platform/platform.h"

#include <gtest/gtest.h>

#include <atomic>
#include <cstring>
#include <thread>

namespace {

using namespace Mz::Test;
using Mz::QrStream;
using Mz::QrStreamEx;
using Mz::QrTextStream;

std::string processLocale() {
    return std::setlocale(LC_ALL, nullptr);
}

class UnderCommaLocale : public testing::Test {
  protected:
    void SetUp() override {
        if (!locale)
            GTEST_SKIP() << "no comma-decimal locale here";
        name = processLocale();
    }
    void TearDown() override {
        if (locale) {
            EXPECT_EQ(processLocale(), name) << "the locale was changed";
        }
    }
    CommaLocale locale;
    std::string name;
};

TEST_F(UnderCommaLocale, NumbersHaveAPoint) {
    const double values[] = {1.5, -1234567.25, 1e-7};
    const std::string text =
        written<QrTextStream>([&](QrStream& stream) { stream.write(values[0], 3); });
    EXPECT_EQ(text, "1.5 -1234567.25 1e-07");
    Reading<QrTextStream> in(text);
    double read[3];
    EXPECT_EQ(in.stream.read(read[0], 3), 3);
    EXPECT_EQ(read[1], -1234567.25);
    Reading<QrTextStream> formatted("1.5e3");
    double value = 0;
    EXPECT_EQ(formatted.stream.formattedRead(L"%lg", &value), 1);
    EXPECT_EQ(value, 1500.0);
}

TEST_F(UnderCommaLocale, AForeignIOSeesThePointDuringEveryCall) {
    RecordingIO io("1.5 2 x");
    int calls = 0;
    int commas = 0;
    io.onCall = [&] {
        ++calls;
        commas += std::strcmp(std::localeconv()->decimal_point, ".") == 0 ? 0 : 1;
    };
    QrTextStream stream(&io);
    double value = 0;
    int number = 0;
    stream << 2.5 << 3;
    stream >> value >> number;
    EXPECT_GT(calls, 8);
    EXPECT_EQ(commas, 0);
    EXPECT_EQ(value, 1.5);
    EXPECT_EQ(io.written(), "2.5 3");
    // Outside formatted reading and writing the IO sees the locale of the process.
    bool flag = false;
    stream >> flag;
    EXPECT_EQ(commas, 2) << "the skipped separator and the character";
}

TEST_F(UnderCommaLocale, TheLocaleComesBackAfterExceptions) {
    {
        RecordingIO io("12 ");
        io.onCall = [] { throw 5; };
        QrTextStream stream(&io);
        int value = 0;
        EXPECT_THROW(stream >> value, int);
        EXPECT_STREQ(std::localeconv()->decimal_point, ",");
        EXPECT_THROW(stream << 1, int);
        EXPECT_STREQ(std::localeconv()->decimal_point, ",");
    }
    Writing<QrTextStream> own;
    EXPECT_THROW(own.stream.formattedWrite(L"%s", L"\x20AC"), QrStreamEx::ExWriteError);
    EXPECT_THROW(own.stream.formattedWrite(L"%"), QrStreamEx::ExWriteError);
    EXPECT_STREQ(std::localeconv()->decimal_point, ",");
}

TEST_F(UnderCommaLocale, FormattedTextIsThatOfTheCLocale) {
    // In the "C" locale every byte is a character.
    Reading<QrTextStream> in("\xE9\xFF ");
    wchar_t text[4]{};
    EXPECT_EQ(in.stream.formattedRead(L"%s", text), 1);
    EXPECT_EQ(std::wstring(text), L"\xE9\xFF");
    EXPECT_EQ(written<QrTextStream>([](QrStream& s) { s.formattedWrite(L"%s", L"\xE9"); }), "\xE9");
}

TEST_F(UnderCommaLocale, ForeignIOsNestInOneAnother) {
    RecordingIO inner;
    QrTextStream innerStream(&inner);
    RecordingIO outer;
    outer.onCall = [&] {
        innerStream << 1.5;
        EXPECT_STREQ(std::localeconv()->decimal_point, ".");
    };
    QrTextStream stream(&outer);
    stream << 2.5;
    EXPECT_STREQ(std::localeconv()->decimal_point, ",");
    EXPECT_EQ(inner.written(), "1.5");
}

/// Runs `work`, which returns whether it succeeded, on several threads; returns the number of
/// failures.
template <class Work>
int inThreads(Work&& work) {
    std::atomic<int> wrong = 0;
    std::vector<std::thread> threads;
    for (int thread = 0; thread < 4; ++thread)
        threads.emplace_back([&, thread] {
            for (int round = 0; round < MZ_RANDOM_VALUES / 500; ++round)
                wrong += work(thread + round * 0.25) ? 0 : 1;
        });
    for (std::thread& thread : threads)
        thread.join();
    return wrong;
}

TEST_F(UnderCommaLocale, ThreadsDoNotDisturbOneAnother) {
    EXPECT_EQ(inThreads([](double value) {
                  Reading<QrTextStream> in(
                      written<QrTextStream>([&](QrStream& s) { s << value << 7; }));
                  double read = -1;
                  int seven = 0;
                  in.stream >> read >> seven;
                  return read == value && seven == 7;
              }),
              0);
}

TEST_F(UnderCommaLocale, ThreadsWithForeignIOsDoNotDisturbOneAnother) {
    EXPECT_EQ(inThreads([](double value) {
                  RecordingIO io(written<QrTextStream>([&](QrStream& s) { s << value; }) + " ");
                  bool point = true;
                  io.onCall = [&] {
                      point = point && std::strcmp(std::localeconv()->decimal_point, ".") == 0;
                  };
                  QrTextStream stream(&io);
                  double read = -1;
                  stream >> read;
                  stream << value;
                  return read == value && point;
              }),
              0);
    EXPECT_EQ(processLocale(), name);
}

TEST_F(UnderCommaLocale, TheBracketNests) {
    {
        Mz::platform::LocaleSwitch shared;
        const Mz::platform::CLocale outer(shared);
        EXPECT_STREQ(std::localeconv()->decimal_point, ".");
        EXPECT_TRUE(Mz::platform::usesPlainBytes());
        {
            const Mz::platform::CLocale inner(shared);
            EXPECT_STREQ(std::localeconv()->decimal_point, ".");
        }
        EXPECT_STREQ(std::localeconv()->decimal_point, ".");
    }
    EXPECT_STREQ(std::localeconv()->decimal_point, ",");
}

TEST_F(UnderCommaLocale, PlainBytesHoldForTheConverterAndOneThread) {
    const bool plainBefore = Mz::bufferedConverter().plainBytes();
    EXPECT_FALSE(plainBefore);
    const Mz::PlainBytes outer;
    {
        const Mz::PlainBytes inner;
        EXPECT_TRUE(Mz::bufferedConverter().plainBytes());
    }
    EXPECT_TRUE(Mz::bufferedConverter().plainBytes());
    std::thread([] { EXPECT_FALSE(Mz::bufferedConverter().plainBytes()); }).join();
    EXPECT_STREQ(std::localeconv()->decimal_point, ",");
}

/// An IO that returns any wide character.
class WideIO final : public Mz::QrCastImpl<WideIO, Mz::QrBufferedIO, const WideIO&> {
  public:
    explicit WideIO(std::wstring characters) : text(std::move(characters)) {}
    std::wstring rest() const { return text.substr(at); }

    int readChar(wchar_t& c) override {
        if (at >= text.size())
            return 0;
        c = text[at++];
        return 1;
    }
    void ungetc(wchar_t c) override { text[--at] = c; }

    bool isBufferIgnored() const override { return false; }
    void writeObject(const Mz::QrCastable*, QrStream&, const wchar_t*, const wchar_t*) override {}
    Mz::QrRef<Mz::QrCastable> readObject(QrStream&, const Mz::QrUid*, const wchar_t*,
                                         const wchar_t*) override {
        return nullptr;
    }
    void write(const void*, int) override {}
    void write(char) override {}
    int read(void*, int) override { return 0; }
    int read() override { return -1; }
    void writeEol() override {}
    void writeSpace() override {}
    int writeChar(const wchar_t*, int count) override { return count; }
    int writeChar(const char*, int size) override { return size; }
    void writeChar(wchar_t) override {}
    void writeChar(char) override {}
    void skipWhiteSpace(int) override {}
    int readChar(wchar_t*, int, int) override { return 0; }
    int readChar(char*, int, int) override { return 0; }
    int readChar(char&) override { return 0; }
    void ungetc(char) override {}
    bool canSeek() const override { return false; }
    Mz::int64 seek(Mz::int64, int) override { return -1; }
    Mz::int64 tell() const override { return -1; }

  private:
    std::wstring text;
    std::size_t at = 0;
};

TEST(WideInput, SetsAndWordsKnowAllSixteenBits) {
    WideIO io(L"\x20AC\xFFFFx");
    QrTextStream stream(&io);
    wchar_t text[8]{};
    EXPECT_EQ(stream.formattedRead(L"%[\x20A0-\xFFFF]", text), 1);
    EXPECT_EQ(std::wstring(text), L"\x20AC\xFFFF");
    EXPECT_EQ(io.rest(), L"x");
    WideIO negated(L"\x20AC]");
    QrTextStream other(&negated);
    EXPECT_EQ(other.formattedRead(L"%[^]]", text), 1);
    EXPECT_EQ(std::wstring(text), L"\x20AC");
}

TEST(WideInput, SetsHaveNoCharacterBeyondSixteenBits) {
    if constexpr (sizeof(wchar_t) > 2)
        for (const unsigned int code : {0x10000U, 0x1F600U, 0x80000000U, 0xFFFFFFFFU})
            for (const wchar_t* format : {L"%[^a]", L"%[\xE000-\xFFFF]", L"%[\xFFFF-\U00010000]"}) {
                const std::wstring character(1, static_cast<wchar_t>(code));
                WideIO io(L"\xFFFF" + character);
                QrTextStream stream(&io);
                wchar_t text[8]{};
                EXPECT_EQ(stream.formattedRead(format, text), 1) << code;
                EXPECT_EQ(std::wstring(text), L"\xFFFF") << code;
                EXPECT_EQ(io.rest(), character) << code;
            }
}

TEST(WideInput, ACharacterWithoutANarrowFormEndsTheScanAndIsGivenBack) {
    WideIO io(L"a\x20AC");
    QrTextStream stream(&io);
    char text[8]{};
    EXPECT_EQ(stream.formattedRead(L"%hs", text), 0);
    EXPECT_EQ(io.rest(), L"\x20AC");
}

TEST(WideInput, CharactersBeyondAsciiAreNeitherDigitsNorSpace) {
    for (const wchar_t* text : {L"\x0661", L"\xFF11",
                                L"\x2003"
                                L"1",
                                L"\xA0"
                                L"1"}) {
        WideIO io(text);
        QrTextStream stream(&io);
        int value = 5;
        EXPECT_EQ(stream.formattedRead(L"%d", &value), 0);
        EXPECT_EQ(value, 5);
        EXPECT_EQ(io.rest(), text);
    }
}

} // namespace
