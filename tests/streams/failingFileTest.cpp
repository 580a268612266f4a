// SPDX-License-Identifier: BSL-1.0
// Tests system files whose operations fail: reading /proc/self/mem at address 0, and writing to
// /dev/full.
#include "tests/streams/support.h"

#include <gtest/gtest.h>

#include <fstream>

namespace {

using namespace Mz::Test;

template <class Stream>
void expectReadErrors() {
    std::ifstream file("/proc/self/mem", std::ios::binary);
    ASSERT_TRUE(file.good());
    Mz::QrInBuffer io(&file);
    Stream stream(&io);
    int value = 77;
    EXPECT_THROW(stream >> value, Mz::QrStreamEx::ExReadError);
    EXPECT_EQ(value, 77);
    EXPECT_TRUE(file.bad());
    file.clear();
    EXPECT_THROW(stream.read(value, 1), Mz::QrStreamEx::ExReadError);
    file.clear();
    EXPECT_THROW(io.read(), Mz::QrStreamEx::ExReadError);
}

TEST(FailingFile, RaisesReadErrorFromText) {
    expectReadErrors<Mz::QrTextStream>();
}

TEST(FailingFile, RaisesReadErrorFromBinaryData) {
    expectReadErrors<Mz::QrBinaryStream>();
}

template <class Stream>
void expectWriteError() {
    std::ofstream file("/dev/full", std::ios::binary);
    ASSERT_TRUE(file.good());
    Mz::QrOutBuffer io(&file);
    Stream stream(&io);
    // The file buffers its output: it fails only when the buffer is full.
    constexpr int moreThanABlock = 100'000;
    EXPECT_THROW(
        {
            for (int value = 0; value < moreThanABlock; ++value)
                stream << value;
        },
        Mz::QrStreamEx::ExWriteError);
    EXPECT_TRUE(file.bad());
}

TEST(FailingFile, RaisesWriteErrorForText) {
    expectWriteError<Mz::QrTextStream>();
}

TEST(FailingFile, RaisesWriteErrorForBinaryData) {
    expectWriteError<Mz::QrBinaryStream>();
}

TEST(FailingFile, RaisesWriteErrorWhereEachWriteIsFlushedUnderAMask) {
    for (const std::ios::iostate mask : {std::ios::goodbit, std::ios::badbit | std::ios::failbit}) {
        std::ofstream file("/dev/full", std::ios::binary);
        file << std::unitbuf;
        file.exceptions(mask);
        Mz::QrOutBuffer io(&file);
        EXPECT_NO_THROW(io.writeEol());
        EXPECT_TRUE(file.bad());
        file.clear();
        EXPECT_NO_THROW(io.writeSpace());
        EXPECT_TRUE(file.bad());
        file.clear();
        EXPECT_THROW(io.write('x'), Mz::QrStreamEx::ExWriteError);
        file.clear();
        Mz::QrTextStream text(&io);
        EXPECT_THROW(text << 1, Mz::QrStreamEx::ExWriteError);
        EXPECT_EQ(file.exceptions(), mask);
        file.clear();
    }
}

} // namespace
