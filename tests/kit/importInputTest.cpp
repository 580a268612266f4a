// SPDX-License-Identifier: BSL-1.0
// The input of an import under a policy, compared with a file of the same bytes.
#include "components/componentKit/importInput.h"
#include "components/componentManager/bufferio.h"
#include "tests/support/temporaryDirectory.h"

#include <gtest/gtest.h>

#include <fstream>
#include <istream>
#include <random>
#include <string>

using namespace Mz;
using Kit::detail::ImportLimits;
using Kit::detail::LimitedInput;

namespace {

LimitedInput::Source sourceOf(const std::string& bytes) {
    return [&bytes](std::uint64_t offset, std::span<char> block) {
        const std::size_t from = std::min<std::size_t>(offset, bytes.size());
        return bytes.copy(block.data(), block.size(), from);
    };
}

std::string someBytes(std::size_t size) {
    std::mt19937 random(1);
    std::string bytes(size, '\0');
    for (char& byte : bytes)
        byte = static_cast<char>(random());
    return bytes;
}

/// Does one operation and returns what can be seen of it.
std::string operate(QrInBuffer& io, unsigned int operation, int number, int size) {
    std::string seen;
    try {
        switch (operation) {
        case 0:
        case 1: seen = std::to_string(io.read()); break;
        case 2: {
            std::string data(static_cast<std::size_t>(number), '-');
            seen = std::to_string(io.read(data.data(), number)) + data;
            break;
        }
        case 3: seen = std::to_string(io.seek(number % (size + 2), 0)); break;
        case 4: seen = std::to_string(io.seek(-(number % (size + 1)), 2)); break;
        case 5: io.ungetc(static_cast<char>(number)); break;
        case 6: seen = std::to_string(io.seek(number % 64 - 32, 1)); break;
        default: seen = io.canSeek() ? "seekable" : "not"; break;
        }
    } catch (const QrStreamEx& failure) {
        seen = failure.getReason();
    }
    return seen + " at " + std::to_string(io.tell());
}

TEST(KitImportInput, IsNoOutputAndHasNoPositionBeforeItsBegin) {
    const std::string bytes = someBytes(100);
    ImportLimits limits({}, {});
    LimitedInput buffer(sourceOf(bytes), bytes.size(), limits);
    const std::streampos none(std::streamoff(-1));
    EXPECT_EQ(buffer.pubseekoff(0, std::ios::beg, std::ios::out), none);
    EXPECT_EQ(buffer.pubseekpos(0, std::ios::out), none);
    EXPECT_EQ(buffer.pubseekoff(-1, std::ios::beg, std::ios::in), none);
    EXPECT_EQ(buffer.pubseekoff(-101, std::ios::end, std::ios::in), none);
    EXPECT_EQ(buffer.pubseekoff(-100, std::ios::end, std::ios::in), std::streampos(0));
    EXPECT_EQ(buffer.sgetc(), std::streambuf::traits_type::to_int_type(bytes[0]));
}

TEST(KitImportInput, GoesBackToTheBlockBefore) {
    constexpr std::size_t block = 16 * 1024;
    const std::string bytes = someBytes(block + 10);
    ImportLimits limits({}, {});
    LimitedInput buffer(sourceOf(bytes), bytes.size(), limits);
    using Traits = std::streambuf::traits_type;
    buffer.pubseekpos(block, std::ios::in);
    EXPECT_EQ(buffer.sgetc(), Traits::to_int_type(bytes[block]));
    EXPECT_EQ(buffer.sungetc(), Traits::not_eof(Traits::eof())) << "whatever byte is there";
    EXPECT_EQ(buffer.sgetc(), Traits::to_int_type(bytes[block - 1]));
}

TEST(KitImportInput, BehavesLikeAFile) {
    for (const int size : {0, 1, 100, 16 * 1024, 16 * 1024 + 1, 50'000}) {
        const std::string bytes = someBytes(static_cast<std::size_t>(size));
        const Mz::Test::TemporaryDirectory folder;
        std::ifstream expectedStream(folder.write("bytes", bytes), std::ios::binary);
        QrInBuffer expected(&expectedStream);

        ImportLimits limits({}, {});
        LimitedInput buffer(sourceOf(bytes), bytes.size(), limits);
        std::istream stream(&buffer);
        QrInBuffer actual(&stream);

        std::mt19937 random(static_cast<unsigned int>(size));
        for (int step = 0; step < 4000; ++step) {
            const unsigned int operation = random() % 8;
            int number = static_cast<int>(random() % 40'000);
            if (operation == 5 && expected.tell() > 0 && expected.tell() <= size)
                number = bytes[static_cast<std::size_t>(expected.tell()) - 1]; // was read
            ASSERT_EQ(operate(actual, operation, number, size),
                      operate(expected, operation, number, size))
                << "size " << size << ", step " << step << ", operation " << operation;
            if (expectedStream.bad() || stream.bad()) {
                ASSERT_EQ(expectedStream.bad(), stream.bad());
                expectedStream.clear();
                stream.clear();
            }
        }
        EXPECT_EQ(limits.firstExceeded(), ImportLimits::Exceeded::none);
    }
}

TEST(KitImportInput, TakesBackAnotherByte) {
    const std::string bytes = someBytes(20'000);
    ImportLimits limits({}, {});
    LimitedInput buffer(sourceOf(bytes), bytes.size(), limits);
    std::istream stream(&buffer);
    QrInBuffer io(&stream);
    for (const int position : {1, 16 * 1024, 16 * 1024 + 1}) {
        io.seek(position, 0);
        io.ungetc('x');
        EXPECT_EQ(io.tell(), position - 1);
        EXPECT_EQ(io.read(), 'x');
        EXPECT_EQ(io.read(), static_cast<unsigned char>(bytes[static_cast<size_t>(position)]));
    }
}

TEST(KitImportInput, EndsAtTheByteLimit) {
    std::string bytes(20'000, 'a');
    ImportLimits limits(20'000, {});
    LimitedInput buffer(sourceOf(bytes), bytes.size(), limits);
    std::istream stream(&buffer);
    QrInBuffer io(&stream);
    std::string data(30'000, '-');
    EXPECT_EQ(io.read(data.data(), 30'000), 20'000);
    EXPECT_EQ(limits.firstExceeded(), ImportLimits::Exceeded::none);

    bytes += 'b'; // The input grows.
    stream.clear();
    io.seek(0, 0);
    EXPECT_EQ(io.read(data.data(), 16'384), 16'384) << "the first block is whole";
    EXPECT_THROW(io.read(), QrStreamEx::ExReadError);
    EXPECT_EQ(limits.firstExceeded(), ImportLimits::Exceeded::bytes);
}

TEST(KitImportInput, EndsWhenTheTimeIsOver) {
    const std::string bytes(10, 'a');
    ImportLimits limits({}, std::chrono::milliseconds(0));
    LimitedInput buffer(sourceOf(bytes), bytes.size(), limits);
    std::istream stream(&buffer);
    QrInBuffer io(&stream);
    EXPECT_THROW(io.read(), QrStreamEx::ExReadError);
    EXPECT_EQ(limits.firstExceeded(), ImportLimits::Exceeded::time);
    EXPECT_TRUE(limits.isTooLarge(11) == false);
}

TEST(KitImportInput, HasNoTimeLimitThatTheClockCannotHold) {
    EXPECT_FALSE(ImportLimits({}, std::chrono::milliseconds::max()).timeIsOver());
    EXPECT_TRUE(ImportLimits({}, std::chrono::milliseconds::min()).timeIsOver());
    EXPECT_FALSE(ImportLimits({}, {}).timeIsOver());
}

TEST(KitImportInput, NotesTheFirstLimit) {
    ImportLimits limits(5, std::chrono::milliseconds(0));
    EXPECT_FALSE(limits.isTooLarge(5));
    EXPECT_TRUE(limits.isTooLarge(6, false));
    EXPECT_EQ(limits.firstExceeded(), ImportLimits::Exceeded::none) << "a companion file";
    EXPECT_TRUE(limits.isTooLarge(6));
    limits.timeIsOver();
    EXPECT_EQ(limits.firstExceeded(), ImportLimits::Exceeded::bytes);
}

} // namespace
