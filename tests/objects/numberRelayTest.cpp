// SPDX-License-Identifier: BSL-1.0
// Tests that numbers pass the IO of objects on the short way with the same results as through its
// virtual functions, and that a derived class receives every call.
#include "tests/objects/support.h"

#include "components/componentManager/numberRelay.h"

#include <array>
#include <limits>
#include <memory>
#include <random>
#include <sstream>
#include <typeinfo>
#include <vector>

namespace {

using namespace Mz;
using namespace Mz::Test;

/// Derived classes, for which streams take no short way, count the characters that they receive.
class DerivedOutput final : public QrObjectOutBuffer {
  public:
    using QrObjectOutBuffer::QrObjectOutBuffer;
    using QrObjectOutBuffer::writeChar;

    int writeChar(const wchar_t* s, int count) override {
        characters += count;
        return QrObjectOutBuffer::writeChar(s, count);
    }

    int characters = 0;
};

class DerivedInput final : public QrObjectInBuffer {
  public:
    using QrObjectInBuffer::QrObjectInBuffer;
    using QrObjectInBuffer::readChar;

    int readChar(wchar_t& c) override {
        ++characters;
        return QrObjectInBuffer::readChar(c);
    }

    int characters = 0;
};

/// Writes values in an order that depends on `seed`. Goes on after a value that is rejected.
void writeRandomly(QrStream& stream, unsigned int seed) {
    std::mt19937 engine(seed);
    const std::array<double, 4> reals{0.1, 1e300, std::numeric_limits<double>::infinity(),
                                      std::numeric_limits<double>::quiet_NaN()};
    for (int round = 0; round < 40; ++round)
        try {
            const auto number = engine();
            switch (engine() % 12) {
            case 0: stream << static_cast<int>(number); break;
            case 1: stream << number; break;
            case 2: stream << reals[number % 2]; break;
            case 3: stream << reals[number % 4]; break;
            case 4: stream << (number % 2 == 0); break;
            case 5: stream.formattedWrite(L"%d", static_cast<int>(number)); break;
            case 6: stream.formattedWrite(L"text%c", number % 2 ? L' ' : L'x'); break;
            case 7: stream << wchar_t(65); break;
            case 8: stream << std::wstring(number % 3, L'y'); break;
            case 9: stream.write(reals[0], 2); break;
            case 10: stream << static_cast<const QrCastable*>(nullptr); break;
            default: stream << static_cast<long long>(number) << 1.5F; break;
            }
        } catch (const QrStreamEx&) {
            // What was rejected must not change what follows.
        }
}

/// Returns what the values are on a stream on an `IO`, inside or outside an object.
template <class IO, class Stream>
std::string written(unsigned int seed, bool inside) {
    // Before the IO, which holds references to all objects that it has written.
    Scripted object(QrUid{1, 2, 3, 4}, 1, [&](QrStream& s) { writeRandomly(s, seed); });
    std::ostringstream sink;
    QrOutBuffer bytes(&sink);
    IO io(&bytes);
    Stream stream(&io);
    try {
        if (inside)
            stream << static_cast<const QrCastable*>(&object);
        else
            writeRandomly(stream, seed);
    } catch (const QrStreamEx& failure) {
        return sink.str() + failure.getReason();
    }
    return sink.str();
}

template <class Stream>
class NumberRelay : public testing::Test {};
TYPED_TEST_SUITE(NumberRelay, StreamKinds);

TYPED_TEST(NumberRelay, WritesWhatTheVirtualFunctionsWrite) {
    for (unsigned int seed = 0; seed < 2000 && !testing::Test::HasFailure(); ++seed)
        for (const bool inside : {false, true})
            EXPECT_EQ((written<QrObjectOutBuffer, TypeParam>(seed, inside)),
                      (written<DerivedOutput, TypeParam>(seed, inside)))
                << seed;
}

/// Reads values in an order that depends on `seed`; returns them.
template <class IO, class Stream>
std::string readRandomly(const std::string& content, unsigned int seed) {
    std::istringstream source(content);
    QrInBuffer bytes(&source);
    IO io(&bytes);
    Stream stream(&io);
    std::mt19937 engine(seed);
    std::ostringstream told;
    for (int round = 0; round < 20; ++round)
        try {
            int number = -1;
            double real = -1;
            bool flag = false;
            std::array<short, 2> shorts{};
            switch (engine() % 6) {
            case 0: stream >> number; break;
            case 1: stream >> real; break;
            case 2: stream >> flag; break;
            case 3: stream.read(shorts[0], 2); break;
            case 4: stream.formattedRead(L"%d", &number); break;
            default: stream.formattedRead(L"%lg%d", &real, &number); break;
            }
            told << number << ',' << real << ',' << flag << shorts[0] << shorts[1] << ';';
        } catch (const QrStreamEx& failure) {
            told << failure.getReason() << ';';
        }
    return told.str() + std::to_string(bytes.tell());
}

TYPED_TEST(NumberRelay, ReadsWhatTheVirtualFunctionsRead) {
    for (unsigned int seed = 0; seed < 2000 && !testing::Test::HasFailure(); ++seed) {
        const std::string content = written<QrObjectOutBuffer, TypeParam>(seed, false);
        EXPECT_EQ((readRandomly<QrObjectInBuffer, TypeParam>(content, seed)),
                  (readRandomly<DerivedInput, TypeParam>(content, seed)))
            << seed;
    }
}

TEST(NumberRelays, LeaveEveryCallToADerivedClass) {
    std::ostringstream sink;
    QrOutBuffer bytes(&sink);
    DerivedOutput output(&bytes);
    QrTextStream out(&output);
    out << 12 << 0.5;
    EXPECT_EQ(output.characters, 5);

    std::istringstream source("12 0.5 ");
    QrInBuffer sourceBytes(&source);
    DerivedInput input(&sourceBytes);
    QrTextStream in(&input);
    int number = 0;
    in >> number;
    EXPECT_EQ(number, 12);
    EXPECT_EQ(input.characters, 3);
}

/// An IO of another library, which declares that it passes numbers on.
class Passing final : public QrCastImpl<Passing, QrForwardingIO, const Passing&> {
  public:
    explicit Passing(QrCastable* io) : QrCastImpl(io) {}

    int writeChar(const wchar_t* s, int count) override {
        ++calls;
        return QrForwardingIO::writeChar(s, count);
    }
    using QrForwardingIO::writeChar;

    static QrBufferedIO* target(QrBufferedIO& io) { return &static_cast<Passing&>(io).inner(); }

    int calls = 0;
};

TEST(NumberRelays, ApplyWhileTheyExist) {
    std::ostringstream sink;
    QrOutBuffer bytes(&sink);
    Passing io(&bytes);
    QrTextStream stream(&io);
    stream << 1;
    EXPECT_EQ(io.calls, 1);
    {
        const QrNumberRelay relay(typeid(Passing), {Passing::target, nullptr, nullptr});
        stream << 2 << std::numeric_limits<double>::infinity();
        EXPECT_EQ(io.calls, 2); // The word for the infinity.
    }
    stream << 3;
    EXPECT_EQ(io.calls, 3);
    {
        const QrNumberRelay again(typeid(Passing), {Passing::target, nullptr, nullptr});
        stream << 4;
        EXPECT_EQ(io.calls, 3);
    }
    stream << 5;
    EXPECT_EQ(io.calls, 4);
    EXPECT_EQ(sink.str(), "1 2 inf 3 4 5");
}

TEST(NumberRelays, BeyondTheRoomForThemHaveNoEffect) {
    std::ostringstream sink;
    QrOutBuffer bytes(&sink);
    Passing io(&bytes);
    QrTextStream stream(&io);
    std::vector<std::unique_ptr<QrNumberRelay>> others;
    for (int count = 0; count < QrNumberRelay::maximumCount; ++count)
        others.push_back(std::make_unique<QrNumberRelay>(typeid(int), QrNumberRelay::Functions{}));
    const QrNumberRelay relay(typeid(Passing), {Passing::target, nullptr, nullptr});
    stream << 1;
    EXPECT_EQ(io.calls, 1);
    EXPECT_EQ(sink.str(), "1");
}

} // namespace
