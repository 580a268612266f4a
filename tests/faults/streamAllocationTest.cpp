// SPDX-License-Identifier: BSL-1.0
/// Tests streams while allocations fail: what was written before a failure is the beginning of what
/// is written without it, and no value is half read.
#include "tests/streams/support.h"
#include "tests/support/failingAllocations.h"

#include <gtest/gtest.h>

#include <streambuf>
#include <tuple>

using namespace Mz;
using namespace Mz::Test;

namespace {

/// A medium that allocates nothing: what it takes is in the first part of `bytes`.
class Block final : public std::streambuf {
  public:
    Block() { setp(bytes, bytes + sizeof bytes); }
    std::string_view content() const { return {bytes, static_cast<std::size_t>(pptr() - bytes)}; }

  private:
    char bytes[65536];
};

/// A medium that supplies bytes of which it keeps no copy, and allocates nothing.
class Bytes final : public std::streambuf {
  public:
    explicit Bytes(std::string_view text) {
        char* const begin = const_cast<char*>(text.data());
        setg(begin, begin, begin + text.size());
    }

  protected:
    pos_type seekoff(off_type offset, std::ios::seekdir origin, std::ios::openmode) override {
        char* const from = origin == std::ios::beg   ? eback()
                           : origin == std::ios::cur ? gptr()
                                                     : egptr();
        setg(eback(), from + offset, egptr());
        return gptr() - eback();
    }
    pos_type seekpos(pos_type position, std::ios::openmode which) override {
        return seekoff(position, std::ios::beg, which);
    }
};

/// One value of each type that can be read back in every form next to the others, and a text that
/// fits no small buffer.
struct Values {
    int64 wide = -1234567890123456789;
    unsigned long long unsignedWide = 18446744073709551615U;
    double real = 0.1;
    float single = 3.25F;
    unsigned long unsignedLong = 4000000000U;
    long number = -70000;
    unsigned int unsignedInt = 4294967295U;
    int integer = -7;
    unsigned short unsignedShort = 65535;
    short small = -3;
    unsigned char byte = 200;
    char letter = 'z';
    std::wstring text = std::wstring(300, L'x') + L" and \xE9";

    auto tied() {
        return std::tie(wide, unsignedWide, real, single, unsignedLong, number, unsignedInt,
                        integer, unsignedShort, small, byte, letter, text);
    }
};

template <class Stream>
class StreamWithoutMemory : public testing::Test {};
using StreamClasses = testing::Types<QrBinaryStream, QrTextStream, BaseStream>;
TYPED_TEST_SUITE(StreamWithoutMemory, StreamClasses);

/// Returns how many members of the tuples are equal before the first that differs.
template <class Tuple>
std::size_t equalMembers(const Tuple& a, const Tuple& b) {
    std::size_t count = 0;
    bool equal = true;
    std::apply(
        [&](const auto&... member) {
            [&]<std::size_t... index>(std::index_sequence<index...>) {
                ((count += (equal = equal && member == std::get<index>(b))), ...);
            }
            (std::index_sequence_for<decltype(member)...>{});
        },
        a);
    return count;
}

TYPED_TEST(StreamWithoutMemory, WritesValuesInOrderUpToTheFailure) {
    Values values;
    const auto write = [&](QrStream& stream) {
        std::apply([&](const auto&... value) { ((stream << value), ...); }, values.tied());
        std::apply([&](const auto&... value) { (stream.write(value, 1), ...); }, values.tied());
        stream.formattedWrite(L"%d %s %g|%200d", 5, std::wstring(500, L'y').c_str(), 2.5, 6);
        stream << 1e300 << QrUid{1, 2, 3, 4} << true;
    };
    const std::string whole = written<TypeParam>(write);
    failEachAllocation([&](Attempt& attempt) {
        Block block;
        std::ostream sink(&block);
        QrOutBuffer buffer(&sink);
        TypeParam stream(&buffer);
        EXPECT_TRUE(attempt.throwsOnFailure([&] { write(stream); }));
        EXPECT_TRUE(whole.starts_with(block.content()));
        EXPECT_EQ(block.content().size() == whole.size(), !attempt.failed);
        EXPECT_TRUE(sink.good());
    });
}

TYPED_TEST(StreamWithoutMemory, ReadsValuesInOrderUpToTheFailure) {
    Values values;
    const std::string whole = written<TypeParam>([&](QrStream& stream) {
        std::apply([&](const auto&... value) { ((stream << value), ...); }, values.tied());
    });
    // In the text form, a string comes back with the separator before it.
    Reading<TypeParam> in(whole);
    std::apply([&](auto&... value) { ((in.stream >> value), ...); }, values.tied());
    const int failures = failEachAllocation([&](Attempt& attempt) {
        Bytes bytes(whole);
        std::istream source(&bytes);
        QrInBuffer buffer(&source);
        TypeParam stream(&buffer);
        Values found{0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, L""};
        std::size_t complete = 0;
        const bool done = attempt.run([&] {
            std::apply([&](auto&... value) { ((stream >> value, ++complete), ...); }, found.tied());
        });
        EXPECT_EQ(done, !attempt.failed);
        EXPECT_GE(equalMembers(found.tied(), values.tied()), complete);
        EXPECT_TRUE(source.good());
        // The same input can be read again from its beginning.
        buffer.seek(0, 0);
        TypeParam second(&buffer);
        std::apply([&](auto&... value) { ((second >> value), ...); }, found.tied());
        EXPECT_TRUE(found.tied() == values.tied());
    });
    EXPECT_GE(failures, leastFailures(2));
}

TYPED_TEST(StreamWithoutMemory, ReadsFormatsOrThrows) {
    const std::string input = "12 " + std::string(400, 'w') + " 0.1 abc]";
    failEachAllocation([&](Attempt& attempt) {
        Bytes bytes(input);
        std::istream source(&bytes);
        QrInBuffer buffer(&source);
        TypeParam stream(&buffer);
        int number = 0, count = 0;
        double real = 0;
        wchar_t word[500], set[10];
        const auto read = [&] {
            count = stream.formattedRead(L"%d %s %lf %[a-c]", &number, word, &real, set);
        };
        EXPECT_TRUE(attempt.throwsOnFailure(read));
        buffer.seek(0, 0);
        read();
        EXPECT_EQ(count, 4);
        EXPECT_EQ(number, 12);
        EXPECT_EQ(std::wstring(word), std::wstring(400, L'w'));
        EXPECT_EQ(real, 0.1);
        EXPECT_STREQ(set, L"abc");
    });
}

} // namespace
