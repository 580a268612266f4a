// SPDX-License-Identifier: BSL-1.0
// Tests values that fit the platform's types but not the widths of a stream. Only where such types
// exist.
#include "tests/streams/support.h"

#include <gtest/gtest.h>

#include <limits>

namespace {

using namespace Mz::Test;
using Mz::QrBinaryStream;
using Mz::QrStreamEx;
using Mz::QrTextStream;

static_assert(sizeof(long) == 8 && sizeof(wchar_t) == 4);

constexpr long smallest = std::numeric_limits<int>::min();
constexpr long largest = std::numeric_limits<int>::max();

/// Expects that no form of the stream can write `value`, and that what was written before is kept.
template <class T>
void expectRefused(T value) {
    {
        Writing<QrBinaryStream> out;
        out.stream << 1;
        if constexpr (std::is_same_v<T, wchar_t>)
            EXPECT_THROW(out.stream.write(value, 1), QrStreamEx::ExWriteError);
        else
            EXPECT_THROW(out.stream << value, QrStreamEx::ExWriteError);
        EXPECT_EQ(toHex(out.bytes()), "00 00 00 01");
        out.stream << 2;
        EXPECT_EQ(toHex(out.bytes()), "00 00 00 01 00 00 00 02");
    }
    {
        Writing<QrTextStream> out;
        out.stream << 1;
        EXPECT_THROW(out.stream << value, QrStreamEx::ExWriteError);
        EXPECT_EQ(out.bytes(), "1");
        out.stream << 2;
        EXPECT_EQ(out.bytes(), "1 2");
    }
}

TEST(NativeWidth, WhatDoesNotFitIsRefused) {
    expectRefused<long>(largest + 1);
    expectRefused<long>(smallest - 1);
    expectRefused<long>(std::numeric_limits<long>::min());
    expectRefused<unsigned long>(0x100000000UL);
    expectRefused<unsigned long>(~0UL);
    expectRefused<wchar_t>(0x10000);
    expectRefused<wchar_t>(0x1F600);
    expectRefused<wchar_t>(static_cast<wchar_t>(-1));
}

template <class T, int Fitting>
void expectArrayStopsAt(T bad, std::size_t width) {
    std::vector<T> values(Fitting + 10, T(7));
    values[Fitting] = bad;
    Writing<QrBinaryStream> out;
    EXPECT_THROW(out.stream.write(values[0], Fitting + 10), QrStreamEx::ExWriteError);
    EXPECT_EQ(out.bytes().size(), Fitting * width);
}

TEST(NativeWidth, AnArrayIsWrittenUpToTheValueThatDoesNotFit) {
    expectArrayStopsAt<long, 0>(largest + 1, 4);
    expectArrayStopsAt<long, 3>(largest + 1, 4);
    expectArrayStopsAt<long, 256>(smallest - 1, 4);
    expectArrayStopsAt<long, 300>(smallest - 1, 4);
    expectArrayStopsAt<unsigned long, 255>(0x100000000UL, 4);
    expectArrayStopsAt<wchar_t, 513>(0x10000, 2);
    const long values[3] = {1, largest + 1, 2};
    Writing<QrTextStream> text;
    EXPECT_THROW(text.stream.write(values[0], 3), QrStreamEx::ExWriteError);
    EXPECT_EQ(text.bytes(), "1");
}

TEST(NativeWidth, FormattedLongsMustFitToo) {
    Writing<QrTextStream> out;
    EXPECT_THROW(out.stream.formattedWrite(L"a%ld", largest + 1), QrStreamEx::ExWriteError);
    EXPECT_THROW(out.stream.formattedWrite(L"%lu", 0x100000000UL), QrStreamEx::ExWriteError);
    EXPECT_THROW(out.stream.formattedWrite(L"%lx", 0x100000000UL), QrStreamEx::ExWriteError);
    EXPECT_EQ(out.bytes(), "");
    EXPECT_EQ(out.stream.formattedWrite(L"%ld|%lu", smallest, 0xFFFFFFFFUL), 22);
}

TEST(NativeWidth, LongsAreSignExtendedAndTheOthersZeroExtended) {
    const std::string bytes = fromHex("FF FF FF FE 80 00 00 00 7F FF FF FF");
    long longs[4] = {5, 5, 5, 5};
    Reading<QrBinaryStream> in(bytes);
    EXPECT_EQ(in.stream.read(longs[0], 3), 3);
    EXPECT_EQ(longs[0], -2);
    EXPECT_EQ(longs[1], smallest);
    EXPECT_EQ(longs[2], largest);
    EXPECT_EQ(longs[3], 5);
    unsigned long unsignedLongs[3];
    Reading<QrBinaryStream> unsignedIn(bytes);
    EXPECT_EQ(unsignedIn.stream.read(unsignedLongs[0], 3), 3);
    EXPECT_EQ(unsignedLongs[0], 0xFFFFFFFEUL);
    wchar_t characters[6];
    Reading<QrBinaryStream> wideIn(bytes);
    EXPECT_EQ(wideIn.stream.read(characters[0], 6), 6);
    EXPECT_EQ(characters[0], L'\xFFFF');
    EXPECT_EQ(characters[5], L'\xFFFF');
    long single = 0;
    Reading<QrBinaryStream> one(bytes);
    one.stream >> single;
    EXPECT_EQ(single, -2);
}

TEST(NativeWidth, AShortArrayLeavesWholeValues) {
    long longs[3] = {5, 5, 5};
    Reading<QrBinaryStream> in(fromHex("FF FF FF FE 00 00 00 01 00 00"));
    EXPECT_EQ(in.stream.read(longs[0], 3), 2);
    EXPECT_EQ(longs[0], -2);
    EXPECT_EQ(longs[1], 1);
}

} // namespace
