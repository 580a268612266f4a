// SPDX-License-Identifier: BSL-1.0
// Tests input that ends too early or claims a greater length than it has.
#include "tests/streams/support.h"

#include <gtest/gtest.h>

#include <cctype>
#include <limits>
#include <sstream>
#include <utility>

namespace {

using namespace Mz::Test;
using Mz::QrBinaryStream;
using Mz::QrStream;
using Mz::QrStreamEx;
using Mz::QrTextStream;
using Mz::QrUid;

template <class T>
T sample() {
    return static_cast<T>(-17);
}
template <>
unsigned long sample<unsigned long>() {
    return 4'000'000'017UL; // Fits in 32 bits: the width of a long on the wire.
}
template <>
std::wstring sample<std::wstring>() {
    return L"ab c";
}
template <>
bool sample<bool>() {
    return true;
}
template <>
wchar_t sample<wchar_t>() {
    return L'w';
}

/// Cuts the binary form of one value, and of an array of three, at every byte.
template <class T>
void cutBinary() {
    const T values[3] = {sample<T>(), sample<T>(), sample<T>()};
    const std::string one =
        written<QrBinaryStream>([&](QrStream& stream) { stream.write(values[0], 1); });
    const std::string three =
        written<QrBinaryStream>([&](QrStream& stream) { stream.write(values[0], 3); });
    for (std::size_t length = 0; length < one.size(); ++length) {
        Reading<QrBinaryStream> in(one.substr(0, length));
        T value{};
        EXPECT_THROW(in.stream >> value, QrStreamEx::ExReadError) << length;
    }
    for (std::size_t length = 0; length <= three.size(); ++length) {
        Reading<QrBinaryStream> in(three.substr(0, length));
        T read[3]{};
        const auto whole = static_cast<int>(length / one.size());
        // An incomplete length ends the array. After a complete length its characters are required.
        const bool startedString = std::is_same_v<T, std::wstring> && length % one.size() >= 4;
        if (startedString) {
            EXPECT_THROW(in.stream.read(read[0], 3), QrStreamEx::ExReadError) << length;
        } else {
            EXPECT_EQ(in.stream.read(read[0], 3), whole) << length;
        }
        for (int index = 0; index < whole; ++index)
            EXPECT_EQ(read[index], values[index]);
    }
}

TEST(CutStream, BinaryValuesRaiseOrCountShort) {
    cutBinary<char>();
    cutBinary<unsigned char>();
    cutBinary<short>();
    cutBinary<unsigned short>();
    cutBinary<int>();
    cutBinary<unsigned int>();
    cutBinary<long>();
    cutBinary<unsigned long>();
    cutBinary<Mz::int64>();
    cutBinary<unsigned long long>();
    cutBinary<float>();
    cutBinary<double>();
    cutBinary<bool>();
    cutBinary<std::wstring>();
    cutBinary<wchar_t>();
}

/// An input that reports another number of bytes than it has read.
class MisreportingInput final : public Mz::QrInBuffer {
  public:
    using Mz::QrInBuffer::QrInBuffer;
    using Mz::QrInBuffer::read;
    int read(void* data, int size) override {
        Mz::QrInBuffer::read(data, size);
        return claim;
    }

    int claim = 0;
};

TEST(CutStream, ACountedReadBelievesNoImpossibleNumberOfBytes) {
    const auto count = [](int claim) {
        std::istringstream source(fromHex("00 00 00 01 00 00 00 02 00 00 00 03 01 00 01"));
        MisreportingInput io(&source);
        QrBinaryStream stream(&io);
        io.claim = claim;
        int numbers[4] = {5, 5, 5, 5};
        const int got = stream.read(numbers[0], 3);
        for (int index = 0; index < got; ++index)
            EXPECT_EQ(numbers[index], index + 1) << claim;
        EXPECT_EQ(numbers[3], 5);
        bool flags[4] = {true, true, true, true};
        const int gotFlags = stream.read(flags[0], 3);
        for (int index = 0; index < gotFlags; ++index)
            EXPECT_EQ(flags[index], index != 1) << claim;
        return std::pair(got, gotFlags);
    };
    EXPECT_EQ(count(-5), std::pair(0, 0));
    EXPECT_EQ(count(0), std::pair(0, 0));
    EXPECT_EQ(count(3), std::pair(0, 3));
    EXPECT_EQ(count(7), std::pair(1, 3));
    EXPECT_EQ(count(12), std::pair(3, 3));
    EXPECT_EQ(count(1000), std::pair(3, 3));
    EXPECT_EQ(count(std::numeric_limits<int>::max()), std::pair(3, 3));
}

TEST(CutStream, ACountedReadCountsWholeValuesOnly) {
    Reading<QrBinaryStream> in(std::string(10, '\1'));
    int values[3] = {5, 5, 5};
    EXPECT_EQ(in.stream.read(values[0], 3), 2);
    EXPECT_EQ(values[0], 0x01010101);
    EXPECT_EQ(values[1], 0x01010101);
    Reading<QrBinaryStream> three(std::string(3, '\1'));
    EXPECT_THROW(three.stream >> values[0], QrStreamEx::ExReadError);
}

TEST(CutStream, AnErrorNamesTheStreamThatReads) {
    int value = 0;
    Reading<QrBinaryStream> in("abc");
    try {
        in.stream >> value;
        FAIL();
    } catch (const QrStreamEx::ExReadError& error) {
        EXPECT_STREQ(error.what(), "Error reading stream.");
        EXPECT_EQ(std::string(error.getDetailedReason())
                      .find("components/componentManager/binaryStream("),
                  0U);
    }
}

/// Cuts the text of one number at every character. A prefix that ends with a digit is a number.
template <class T>
void cutText() {
    const std::string text = written<QrTextStream>([](QrStream& stream) { stream << sample<T>(); });
    for (std::size_t length = 0; length < text.size(); ++length) {
        const std::string prefix = text.substr(0, length);
        Reading<QrTextStream> in(prefix);
        Reading<QrTextStream> counted(prefix);
        T value{};
        T one{};
        if (length == 0 || !std::isdigit(prefix.back())) {
            EXPECT_THROW(in.stream >> value, QrStreamEx::ExReadError) << prefix;
            EXPECT_EQ(counted.stream.read(one, 1), 0) << prefix;
        } else {
            in.stream >> value;
            EXPECT_EQ(counted.stream.read(one, 1), 1);
            EXPECT_EQ(value, static_cast<T>(std::stoll(prefix))) << prefix;
            EXPECT_EQ(one, value);
        }
    }
}

TEST(CutStream, TextNumbersAreWhatDigitsAreThere) {
    cutText<char>();
    cutText<short>();
    cutText<int>();
    cutText<unsigned int>();
    cutText<long>();
    cutText<unsigned long>();
    cutText<Mz::int64>();
    cutText<float>();
    cutText<double>();
}

TEST(CutStream, TextStringsRaise) {
    const std::string text =
        written<QrTextStream>([](QrStream& stream) { stream << sample<std::wstring>(); });
    // The string's first character is the separator, so the last character of the text is never
    // needed.
    for (std::size_t length = 0; length + 1 < text.size(); ++length) {
        Reading<QrTextStream> in(text.substr(0, length));
        std::wstring value;
        EXPECT_THROW(in.stream >> value, QrStreamEx::ExReadError) << length;
        Reading<QrTextStream> counted(text.substr(0, length));
        if (length == 0) {
            EXPECT_EQ(counted.stream.read(value, 1), 0);
        } else {
            EXPECT_THROW(counted.stream.read(value, 1), QrStreamEx::ExReadError) << length;
        }
    }
}

TEST(CutStream, IdentifiersRaise) {
    const QrUid uid{11, 22, 33, 44};
    const auto write = [&](QrStream& stream) { stream << uid; };
    const std::string binary = written<QrBinaryStream>(write);
    ASSERT_EQ(binary.size(), 16U);
    for (std::size_t length = 0; length < binary.size(); ++length) {
        Reading<QrBinaryStream> in(binary.substr(0, length));
        QrUid read{};
        EXPECT_THROW(in.stream >> read, QrStreamEx::ExReadError) << length;
    }
    const std::string text = written<QrTextStream>(write);
    for (std::size_t length = 0; length + 2 < text.size(); ++length) {
        Reading<QrTextStream> in(text.substr(0, length));
        QrUid read{};
        EXPECT_THROW(in.stream >> read, QrStreamEx::ExReadError) << length;
    }
}

TEST(CutStream, BoolsAndCharactersRaise) {
    bool flag = false;
    EXPECT_THROW(Reading<QrTextStream>("").stream >> flag, QrStreamEx::ExReadError);
    EXPECT_THROW(Reading<QrBinaryStream>("").stream >> flag, QrStreamEx::ExReadError);
    EXPECT_EQ(Reading<QrTextStream>("").stream.read(flag, 1), 0);
}

/// The allowed capacity of a string after a failure: the characters of the input, and what the
/// string grows ahead of them.
constexpr std::size_t ahead = 200'000;

template <class Stream>
void expectCheapFailure(const std::string& bytes, std::size_t limit = ahead) {
    std::wstring value;
    Reading<Stream> single(bytes);
    EXPECT_THROW(single.stream >> value, QrStreamEx::ExReadError);
    EXPECT_LE(value.capacity(), limit);
    std::wstring counted[2];
    Reading<Stream> many(bytes);
    EXPECT_THROW(many.stream.read(counted[0], 2), QrStreamEx::ExReadError);
    EXPECT_LE(counted[0].capacity(), limit);
}

TEST(CutStream, AFalseLengthCostsNoMoreThanTheInputHas) {
    for (const char* length : {"7F FF FF FF", "FF FF FF FF", "80 00 00 00", "40 00 00 00"}) {
        SCOPED_TRACE(length);
        expectCheapFailure<QrBinaryStream>(fromHex(length) + "abc");
        expectCheapFailure<QrBinaryStream>(fromHex(length));
        expectCheapFailure<QrBinaryStream>(fromHex(length) + std::string(1'000'000, 'x'),
                                           4'000'000);
    }
    for (const char* length : {"2147483647", "-1", "-2147483648", "4294967295", "2000000000"}) {
        SCOPED_TRACE(length);
        expectCheapFailure<QrTextStream>(std::string(length) + " abc");
        expectCheapFailure<QrTextStream>(std::string(length));
    }
}

TEST(CutStream, ANulFillsNoMoreThanAMillionCharacters) {
    const std::string nul(1, '\0');
    for (const char* length : {"7F FF FF FF", "00 20 00 00", "00 10 00 01"}) {
        SCOPED_TRACE(length);
        expectCheapFailure<QrBinaryStream>(fromHex(length) + nul, 2'500'000);
        expectCheapFailure<QrBinaryStream>(fromHex(length) + "abc" + nul, 2'500'000);
    }
    expectCheapFailure<QrTextStream>("2147483647 " + nul, 2'500'000);
    // A short string is filled up with NULs. The NUL byte stays unread.
    Reading<QrBinaryStream> in(fromHex("00 00 00 04") + "a" + nul + "b");
    std::wstring value;
    in.stream >> value;
    EXPECT_EQ(value, std::wstring(L"a\0\0\0", 4));
    EXPECT_EQ(in.rest(), nul + "b");
}

TEST(CutStream, LongStringsComeBackWhole) {
    for (const std::size_t length : {65535U, 65536U, 65537U, 1'048'576U, 1'048'577U, 3'000'001U}) {
        std::wstring text(length, L'x');
        text.back() = L'\xFE';
        Reading<QrBinaryStream> in(
            written<QrBinaryStream>([&](QrStream& stream) { stream << text << 5; }));
        std::wstring read;
        int five = 0;
        in.stream >> read >> five;
        EXPECT_TRUE(read == text) << length;
        EXPECT_EQ(five, 5);
    }
}

TEST(CutStream, WhatWasReadBeforeAFailureStays) {
    Reading<QrTextStream> in("1 2 x");
    int a = 0;
    int b = 0;
    int c = 7;
    EXPECT_THROW(in.stream >> a >> b >> c, QrStreamEx::ExReadError);
    EXPECT_EQ(a, 1);
    EXPECT_EQ(b, 2);
    EXPECT_EQ(c, 7);
    EXPECT_EQ(in.rest(), "x");
}

} // namespace
