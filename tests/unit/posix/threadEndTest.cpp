// SPDX-License-Identifier: BSL-1.0
// Tests threads that end inside a standard stream below a buffer.
#include "components/componentManager/bufferio.h"

#include <gtest/gtest.h>

#include <istream>
#include <pthread.h>
#include <streambuf>
#include <thread>

using namespace Mz;

namespace {

constexpr std::ios::iostate everyFlag = std::ios::badbit | std::ios::eofbit | std::ios::failbit;

/// A medium whose flush ends the thread, as a cancellation during a blocking write does.
class EndsThread final : public std::streambuf {
  protected:
    int_type overflow(int_type byte) override { return traits_type::not_eof(byte); }
    int_type underflow() override { return 'x'; }
    int_type uflow() override { return 'x'; }
    int sync() override { ::pthread_exit(nullptr); }
};

/// Returns whether a thread that runs `work` ends inside it and unwinds its stack.
template <class Work>
bool endsInside(const Work& work) {
    bool unwound = false;
    bool finished = false;
    std::thread([&] {
        struct Unwinding {
            bool& seen;
            ~Unwinding() { seen = true; }
        } const unwinding{unwound};
        work();
        finished = true;
    }).join();
    return unwound && !finished;
}

TEST(EndOfAThread, PassesThroughAFlushAndLeavesTheStreamAsItWas) {
    EndsThread medium;
    std::ostream stream(&medium);
    stream << std::unitbuf;
    stream.exceptions(everyFlag);
    QrOutBuffer out(&stream);
    EXPECT_TRUE(endsInside([&] { out.write('x'); }));
    EXPECT_TRUE(stream.bad());
    EXPECT_EQ(stream.exceptions(), everyFlag);
    EXPECT_TRUE(stream.flags() & std::ios::unitbuf);
}

TEST(EndOfAThread, PassesThroughTheFlushOfATiedStream) {
    EndsThread medium;
    std::ostream tied(&medium);
    tied << std::unitbuf;
    tied.exceptions(everyFlag);
    std::istream stream(&medium);
    stream.tie(&tied);
    stream.exceptions(everyFlag);
    QrInBuffer in(&stream);
    EXPECT_TRUE(endsInside([&] { in.read(); }));
    EXPECT_EQ(stream.tie(), &tied);
    EXPECT_EQ(stream.exceptions(), everyFlag);
    EXPECT_EQ(tied.exceptions(), everyFlag);
    EXPECT_TRUE(tied.flags() & std::ios::unitbuf);
}

} // namespace
