// SPDX-License-Identifier: BSL-1.0
// Tests the buffers on standard streams that flush themselves or a tied stream, and that throw
// according to their exception mask.
#include "components/componentManager/bufferio.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <functional>
#include <istream>
#include <ostream>
#include <streambuf>
#include <string>
#include <vector>

using namespace Mz;
using testing::ElementsAre;

namespace {

constexpr std::ios::iostate everyFlag = std::ios::badbit | std::ios::eofbit | std::ios::failbit;

enum class Sync { Works, Fails, Throws };

using Calls = std::vector<std::string>;

/// A medium that records each virtual call. Its flush works, fails or throws.
class NotingBuffer : public std::streambuf {
  public:
    NotingBuffer(Calls& calls, std::string name, Sync flushing, std::string input = {})
        : calls(calls), name(std::move(name)), flushing(flushing), source(std::move(input)) {}

    std::string accepted;

  protected:
    int_type overflow(int_type byte) override {
        note("overflow");
        accepted += traits_type::to_char_type(byte);
        return traits_type::not_eof(byte);
    }
    std::streamsize xsputn(const char* data, std::streamsize size) override {
        note("xsputn");
        accepted.append(data, static_cast<std::size_t>(size));
        return size;
    }
    int_type underflow() override { return take("underflow", 0); }
    int_type uflow() override { return take("uflow", 1); }
    int_type pbackfail(int_type byte) override {
        note("pbackfail");
        if (at == 0)
            return traits_type::eof();
        source[--at] = traits_type::to_char_type(byte);
        return traits_type::not_eof(byte);
    }
    pos_type seekoff(off_type offset, std::ios::seekdir, std::ios::openmode) override {
        note("seekoff");
        return offset;
    }
    int sync() override {
        note("sync");
        if (flushing == Sync::Throws)
            throw 5;
        return flushing == Sync::Works ? 0 : -1;
    }

  private:
    void note(const char* call) { calls.push_back(name + call); }
    int_type take(const char* call, std::size_t step) {
        note(call);
        if (at >= source.size())
            return traits_type::eof();
        const int_type byte = traits_type::to_int_type(source[at]);
        at += step;
        return byte;
    }

    Calls& calls;
    std::string name;
    Sync flushing;
    std::string source;
    std::size_t at = 0;
};

using Write = std::function<void(QrBufferedIO&)>;

const std::vector<Write>& noticingWrites() {
    static const std::vector<Write> writes = {
        [](QrBufferedIO& io) { io.write('x'); },
        [](QrBufferedIO& io) { io.write("x", 1); },
        [](QrBufferedIO& io) { io.writeChar("x", 1); },
        [](QrBufferedIO& io) { io.writeChar(L"x", 1); },
        [](QrBufferedIO& io) { io.writeChar('x'); },
        [](QrBufferedIO& io) { io.writeChar(L'x'); },
    };
    return writes;
}

template <class Check>
void underEveryMaskAndFailure(Check&& check) {
    for (const std::ios::iostate mask : {std::ios::goodbit, std::ios::badbit, everyFlag})
        for (const Sync flushing : {Sync::Fails, Sync::Throws})
            check(mask, flushing);
}

TEST(FlushedOutput, ThatFailsIsAWriteErrorUnderEveryMask) {
    underEveryMaskAndFailure([](std::ios::iostate mask, Sync flushing) {
        for (const Write& write : noticingWrites()) {
            Calls calls;
            NotingBuffer medium(calls, "", flushing);
            std::ostream stream(&medium);
            stream << std::unitbuf;
            stream.exceptions(mask);
            QrOutBuffer out(&stream);
            EXPECT_THROW(write(out), QrStreamEx::ExWriteError);
            EXPECT_EQ(medium.accepted, "x");
            EXPECT_EQ(stream.rdstate(), std::ios::badbit);
            EXPECT_EQ(stream.exceptions(), mask);
            EXPECT_TRUE(stream.flags() & std::ios::unitbuf);
            EXPECT_THROW(write(out), QrStreamEx::ExWriteError);
            EXPECT_EQ(medium.accepted, "x");
        }
    });
}

TEST(FlushedOutput, ThatFailsAtALineEndOrSpaceIsNoticedByTheNextWrite) {
    underEveryMaskAndFailure([](std::ios::iostate mask, Sync flushing) {
        Calls calls;
        NotingBuffer medium(calls, "", flushing);
        std::ostream stream(&medium);
        stream << std::unitbuf;
        stream.exceptions(mask);
        QrOutBuffer out(&stream);
        EXPECT_NO_THROW(out.writeEol());
        EXPECT_EQ(stream.rdstate(), std::ios::badbit);
        EXPECT_NO_THROW(out.writeSpace());
        EXPECT_EQ(out.tell(), -1);
        EXPECT_FALSE(out.canSeek());
        EXPECT_THROW(out.seek(1, 0), QrStreamEx::ExWriteError);
        EXPECT_THROW(out.write('x'), QrStreamEx::ExWriteError);
        EXPECT_EQ(medium.accepted, "\n");
    });
}

/// Returns the calls that `work` causes. With `bare` false the stream has unitbuf, a tied stream
/// and a full exception mask.
template <class Work>
Calls callsOf(bool bare, const Work& work) {
    Calls calls;
    NotingBuffer tiedMedium(calls, "tied ", Sync::Works);
    std::ostream tied(&tiedMedium);
    NotingBuffer medium(calls, "", Sync::Works, "abcdef");
    std::iostream stream(&medium);
    if (!bare) {
        stream << std::unitbuf;
        stream.tie(&tied);
        stream.exceptions(everyFlag);
    }
    work(stream);
    EXPECT_EQ(stream.tie(), bare ? nullptr : &tied);
    return calls;
}

TEST(FlushedOutput, MakesTheCallsOfTheStandardLibrary) {
    using Stream = std::iostream;
    const auto expectSame = [](const auto& own, const auto& standard) {
        for (const bool bare : {false, true}) {
            const Calls calls = callsOf(bare, standard);
            EXPECT_FALSE(calls.empty());
            EXPECT_EQ(callsOf(bare, own), calls);
        }
    };
    expectSame([](Stream& s) { QrOutBuffer(&s).write('x'); }, [](Stream& s) { s.put('x'); });
    expectSame([](Stream& s) { QrOutBuffer(&s).write("xy", 2); },
               [](Stream& s) { s.write("xy", 2); });
    expectSame([](Stream& s) { QrOutBuffer(&s).tell(); }, [](Stream& s) { s.tellp(); });
    expectSame([](Stream& s) { QrOutBuffer(&s).seek(1, 0); },
               [](Stream& s) { s.seekp(1, std::ios::beg).tellp(); });
    expectSame([](Stream& s) { QrInBuffer(&s).read(); }, [](Stream& s) { s.get(); });
    expectSame(
        [](Stream& s) {
            QrInBuffer in(&s);
            in.read();
            in.ungetc('x');
        },
        [](Stream& s) {
            s.get();
            s.putback('x');
        });
    expectSame([](Stream& s) { QrInBuffer(&s).tell(); }, [](Stream& s) { s.tellg(); });
    expectSame([](Stream& s) { QrInBuffer(&s).seek(1, 0); },
               [](Stream& s) { s.seekg(1, std::ios::beg).tellg(); });
    EXPECT_THAT(callsOf(false, [](Stream& s) { QrOutBuffer(&s).write('x'); }),
                ElementsAre("tied sync", "overflow", "sync"));
}

TEST(FlushedOutput, ClearsTheEndBeforeItDecidesOnTheTiedStream) {
    const auto atEnd = [](const auto& work) {
        return callsOf(false, [&](std::iostream& stream) {
            stream.exceptions(std::ios::goodbit);
            stream.get();
            stream.setstate(std::ios::eofbit);
            work(stream);
            EXPECT_TRUE(stream.good());
        });
    };
    EXPECT_EQ(atEnd([](std::iostream& s) { QrInBuffer(&s).ungetc('x'); }),
              atEnd([](std::iostream& s) { s.putback('x'); }));
    EXPECT_EQ(atEnd([](std::iostream& s) { QrInBuffer(&s).seek(1, 0); }),
              atEnd([](std::iostream& s) { s.seekg(1, std::ios::beg).tellg(); }));
}

TEST(FlushedOutput, IsNotFlushedWhileAnExceptionIsOnItsWay) {
    Calls calls;
    NotingBuffer medium(calls, "", Sync::Works);
    std::ostream stream(&medium);
    stream << std::unitbuf;
    struct WritesAtTheEnd {
        std::ostream& stream;
        ~WritesAtTheEnd() { QrOutBuffer(&stream).write('x'); }
    };
    try {
        const WritesAtTheEnd writer{stream};
        throw 5;
    } catch (int) {
        EXPECT_THAT(calls, ElementsAre("overflow"));
    }
}

/// A tied stream that is tied to a further stream. The flush of both fails or throws.
struct FailingTied {
    FailingTied(std::ios::iostate mask, Sync flushing, bool unitbuf)
        : medium(calls, "tied ", flushing), lastMedium(calls, "last ", flushing), mask(mask) {
        for (std::ostream* each : {&stream, &last}) {
            if (unitbuf)
                *each << std::unitbuf;
            each->exceptions(mask);
        }
        stream.tie(&last);
    }
    void expectItsOwnFailure() const {
        for (const std::ostream* each : {&stream, &last}) {
            EXPECT_EQ(each->rdstate() & std::ios::badbit, std::ios::badbit);
            EXPECT_EQ(each->exceptions(), mask);
        }
        EXPECT_EQ(stream.tie(), &last);
    }

    Calls calls;
    NotingBuffer medium;
    NotingBuffer lastMedium;
    std::ostream stream{&medium};
    std::ostream last{&lastMedium};
    std::ios::iostate mask;
};

template <class Check>
void withEveryFailingTiedStream(Check&& check) {
    underEveryMaskAndFailure([&](std::ios::iostate mask, Sync flushing) {
        for (const bool unitbuf : {false, true})
            for (const std::ios::iostate ownMask : {std::ios::goodbit, everyFlag}) {
                FailingTied tied(mask, flushing, unitbuf);
                check(tied, ownMask);
            }
    });
}

TEST(TiedOutput, IsWrittenThoughTheOtherStreamFails) {
    for (const Write& write : noticingWrites())
        withEveryFailingTiedStream([&](FailingTied& tied, std::ios::iostate mask) {
            Calls calls;
            NotingBuffer medium(calls, "", Sync::Works);
            std::ostream stream(&medium);
            stream.tie(&tied.stream);
            stream.exceptions(mask);
            QrOutBuffer out(&stream);
            EXPECT_NO_THROW(write(out));
            EXPECT_NO_THROW(out.writeEol());
            EXPECT_NO_THROW(out.writeSpace());
            EXPECT_EQ(medium.accepted, "x\n ");
            EXPECT_EQ(out.seek(1, 0), 0) << "the medium's position is always 0";
            EXPECT_TRUE(stream.good());
            EXPECT_EQ(stream.tie(), &tied.stream);
            tied.expectItsOwnFailure();
        });
}

TEST(TiedInput, IsReadThoughTheOtherStreamFails) {
    withEveryFailingTiedStream([](FailingTied& tied, std::ios::iostate mask) {
        Calls calls;
        NotingBuffer medium(calls, "", Sync::Works, " abcdefgh");
        std::istream stream(&medium);
        stream.tie(&tied.stream);
        stream.exceptions(mask);
        QrInBuffer in(&stream);
        wchar_t wide[2];
        char narrow[2];
        in.skipWhiteSpace(5);
        EXPECT_EQ(in.read(), 'a');
        EXPECT_EQ(in.readChar(wide, 2, 2), 2);
        EXPECT_EQ(in.readChar(narrow, 2, 2), 2);
        EXPECT_EQ(narrow[1], 'e');
        in.ungetc('X');
        in.ungetc(L'Y');
        EXPECT_EQ(in.read(), 'Y');
        EXPECT_EQ(in.read(narrow, 2), 2);
        EXPECT_EQ(narrow[0], 'X');
        EXPECT_EQ(in.tell(), 0) << "the medium's position is always 0";
        EXPECT_TRUE(stream.good());
        EXPECT_EQ(stream.tie(), &tied.stream);
        tied.expectItsOwnFailure();
    });
}

} // namespace
