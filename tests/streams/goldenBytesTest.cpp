// SPDX-License-Identifier: BSL-1.0
// Tests the text and binary form of every type against golden bytes.
#include "tests/streams/support.h"

#include <gtest/gtest.h>

#include <limits>
#include <map>

namespace {

using namespace Mz::Test;
using Mz::QrBinaryStream;
using Mz::QrStream;
using Mz::QrTextStream;

/// The form of three values of a type: the first one alone, and all as an array. Existing files
/// contain these bytes. If a test here fails, those files cannot be read any more.
struct Golden {
    const char* type;
    const char* singleText;
    const char* countedText;
    const char* singleBinary;
    const char* countedBinary;
};

constexpr Golden table[] = {
    {"char", "-128", "-128 127 65", "80", "80 7F 41"},
    {"unsigned char", "255", "255 0 65", "FF", "FF 00 41"},
    {"short", "-32768", "-32768 32767 258", "80 00", "80 00 7F FF 01 02"},
    {"unsigned short", "65535", "65535 0 258", "FF FF", "FF FF 00 00 01 02"},
    {"int", "16909060", "16909060 -2147483648 2147483647", "01 02 03 04",
     "01 02 03 04 80 00 00 00 7F FF FF FF"},
    {"unsigned int", "4294967295", "4294967295 0 16909060", "FF FF FF FF",
     "FF FF FF FF 00 00 00 00 01 02 03 04"},
    {"long", "-2147483648", "-2147483648 2147483647 16909060", "80 00 00 00",
     "80 00 00 00 7F FF FF FF 01 02 03 04"},
    {"unsigned long", "4294967295", "4294967295 0 16909060", "FF FF FF FF",
     "FF FF FF FF 00 00 00 00 01 02 03 04"},
    {"int64", "-9223372036854775808", "-9223372036854775808 9223372036854775807 72623859790382856",
     "80 00 00 00 00 00 00 00",
     "80 00 00 00 00 00 00 00 7F FF FF FF FF FF FF FF 01 02 03 04 05 06 07 08"},
    {"unsigned int64", "18446744073709551615", "18446744073709551615 0 72623859790382856",
     "FF FF FF FF FF FF FF FF",
     "FF FF FF FF FF FF FF FF 00 00 00 00 00 00 00 00 01 02 03 04 05 06 07 08"},
    {"float", "0.100000001", "0.100000001 -0 1e+10", "3D CC CC CD",
     "3D CC CC CD 80 00 00 00 50 15 02 F9"},
    {"double", "1", "1 0.1 -1.797693134862316e+308", "3F F0 00 00 00 00 00 00",
     "3F F0 00 00 00 00 00 00 3F B9 99 99 99 99 99 9A FF EF FF FF FF FF FF FF"},
    {"bool", "1", "101", "01", "01 00 01"},
    // A single character is text in a binary stream, too.
    {"wchar_t", "65", "65 8364 65535", "36 35", "00 41 20 AC FF FF"},
    {"string", "3 a b", "3 a b0 2 \xE9z", "00 00 00 03 61 20 62",
     "00 00 00 03 61 20 62 00 00 00 00 00 00 00 02 E9 7A"},
};

template <class T>
void expectWrites(const Golden& golden, const T (&values)[3]) {
    SCOPED_TRACE(golden.type);
    const auto single = [&](QrStream& stream) { stream << values[0]; };
    const auto counted = [&](QrStream& stream) { stream.write(values[0], 3); };
    EXPECT_EQ(written<QrTextStream>(single), golden.singleText);
    EXPECT_EQ(written<QrTextStream>(counted), golden.countedText);
    EXPECT_EQ(toHex(written<QrBinaryStream>(single)), golden.singleBinary);
    EXPECT_EQ(toHex(written<QrBinaryStream>(counted)), golden.countedBinary);
    EXPECT_EQ(written<BaseStream>(single), golden.singleText);
    EXPECT_EQ(toHex(written<BaseStream>(counted)), golden.countedBinary);
}

template <class Stream, class T>
void expectReads(const std::string& single, const std::string& counted, const T (&values)[3]) {
    Reading<Stream> one(single);
    T value{};
    one.stream >> value;
    EXPECT_EQ(value, values[0]);
    EXPECT_EQ(one.rest(), "");

    Reading<Stream> many(counted);
    T array[3]{};
    EXPECT_EQ(many.stream.read(array[0], 3), 3);
    for (int index = 0; index < 3; ++index)
        EXPECT_EQ(array[index], values[index]);
    EXPECT_EQ(many.rest(), "");
}

template <class T>
void expectWritesAndReads(const Golden& golden, const T (&values)[3]) {
    expectWrites(golden, values);
    SCOPED_TRACE(golden.type);
    expectReads<QrTextStream>(golden.singleText, golden.countedText, values);
    expectReads<QrBinaryStream>(fromHex(golden.singleBinary), fromHex(golden.countedBinary),
                                values);
    expectReads<BaseStream>(golden.singleText, fromHex(golden.countedBinary), values);
}

/// A single character is written as its code and cannot be read. Every stream reads arrays as
/// binary data.
void expectCharacters(const Golden& golden) {
    const wchar_t values[3] = {L'A', L'\x20AC', L'\xFFFF'};
    expectWrites(golden, values);
    wchar_t array[3]{};
    Reading<QrTextStream> text(fromHex(golden.countedBinary));
    EXPECT_EQ(text.stream.read(array[0], 3), 3);
    EXPECT_EQ(std::wstring(array, 3), std::wstring(values, 3));
    Reading<QrBinaryStream> binary(fromHex(golden.countedBinary));
    EXPECT_EQ(binary.stream.read(array[0], 3), 3);
    EXPECT_EQ(std::wstring(array, 3), std::wstring(values, 3));
    wchar_t character = L'?';
    Reading<QrBinaryStream> single(fromHex(golden.singleBinary));
    EXPECT_THROW(single.stream >> character, Mz::QrStreamEx::ExReadError);
    EXPECT_EQ(character, L'?');
}

/// Strings are read back from binary data only. Text returns them shifted by the separator.
void expectStrings(const Golden& golden) {
    const std::wstring values[3] = {L"a b", L"", L"\xE9z"};
    expectWrites(golden, values);
    expectReads<QrBinaryStream>(fromHex(golden.singleBinary), fromHex(golden.countedBinary),
                                values);
}

void expectType(const Golden& golden) {
    const std::string type = golden.type;
    constexpr auto intMin = std::numeric_limits<int>::min();
    constexpr auto intMax = std::numeric_limits<int>::max();
    if (type == "char")
        expectWritesAndReads<char>(golden, {'\x80', '\x7F', 'A'});
    else if (type == "unsigned char")
        expectWritesAndReads<unsigned char>(golden, {255, 0, 65});
    else if (type == "short")
        expectWritesAndReads<short>(golden, {-32768, 32767, 258});
    else if (type == "unsigned short")
        expectWritesAndReads<unsigned short>(golden, {65535, 0, 258});
    else if (type == "int")
        expectWritesAndReads<int>(golden, {16909060, intMin, intMax});
    else if (type == "unsigned int")
        expectWritesAndReads<unsigned int>(golden, {0xFFFFFFFFU, 0, 16909060});
    else if (type == "long")
        expectWritesAndReads<long>(golden, {intMin, intMax, 16909060});
    else if (type == "unsigned long")
        expectWritesAndReads<unsigned long>(golden, {0xFFFFFFFFUL, 0, 16909060});
    else if (type == "int64")
        expectWritesAndReads<Mz::int64>(golden, {std::numeric_limits<Mz::int64>::min(),
                                                 std::numeric_limits<Mz::int64>::max(),
                                                 0x0102030405060708LL});
    else if (type == "unsigned int64")
        expectWritesAndReads<unsigned long long>(golden, {~0ULL, 0, 0x0102030405060708ULL});
    else if (type == "float")
        expectWritesAndReads<float>(golden, {0.1F, -0.0F, 1e10F});
    else if (type == "double")
        // The text of the largest double cannot be read back: that needs a seventeenth digit.
        expectWrites<double>(golden, {1.0, 0.1, -std::numeric_limits<double>::max()});
    else if (type == "bool")
        expectWritesAndReads<bool>(golden, {true, false, true});
    else if (type == "wchar_t")
        expectCharacters(golden);
    else if (type == "string")
        expectStrings(golden);
    else
        FAIL() << "no values for " << type;
}

TEST(GoldenBytes, EveryTypeLooksAsItAlwaysDidInBothEncodings) {
    for (const Golden& golden : table)
        expectType(golden);
    EXPECT_EQ(std::size(table), 15U);
}

TEST(GoldenBytes, DoublesOfTheTableComeBackFromBothEncodings) {
    const double values[3] = {1.0, 0.1, -1e300};
    expectReads<QrTextStream>("1", "1 0.1 -1e+300", values);
    expectReads<QrBinaryStream>(
        fromHex("3F F0 00 00 00 00 00 00"),
        written<QrBinaryStream>([&](QrStream& s) { s.write(values[0], 3); }), values);
}

TEST(GoldenBytes, AnIdentifierIsItsFourWords) {
    const Mz::QrUid uid{0x01020304, 0xA78111D1, 0, 0xFFFFFFFF};
    const auto write = [&](QrStream& stream) { stream << uid; };
    EXPECT_EQ(toHex(written<QrBinaryStream>(write)),
              "01 02 03 04 A7 81 11 D1 00 00 00 00 FF FF FF FF");
    EXPECT_EQ(written<QrTextStream>(write), "16909060 2810253777 0 4294967295");

    Mz::QrUid read{};
    Reading<QrBinaryStream> binary(written<QrBinaryStream>(write));
    binary.stream >> read;
    EXPECT_EQ(read, uid);
    EXPECT_EQ(binary.rest(), "");
    read = {};
    Reading<QrTextStream> text("16909060 2810253777\n0 4294967295");
    text.stream >> read;
    EXPECT_EQ(read, uid);
}

} // namespace
