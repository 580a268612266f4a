// SPDX-License-Identifier: BSL-1.0
// Tests the operations that a buffer rejects: writing to input, reading from output, and objects.
#include "components/componentManager/bufferio.h"

#include <gtest/gtest.h>

#include <functional>
#include <sstream>
#include <string_view>

namespace Mz {

/// The buffers pass a stream on without using it, so the tests need only a name.
class QrStream {};

} // namespace Mz

using namespace Mz;

namespace {

template <class Ex>
void expectRefusal(const char* reason, const std::function<void()>& call) {
    try {
        call();
        ADD_FAILURE() << "nothing was thrown";
    } catch (const Ex& refusal) {
        EXPECT_STREQ(refusal.getReason(), reason);
        const std::string_view detail(refusal.getDetailedReason());
        EXPECT_EQ(detail.find("components/componentManager/bufferio("), 0u) << detail;
    }
}

TEST(InBuffer, RefusesEveryWriteAndTouchesNothing) {
    std::istringstream stream("abc");
    QrInBuffer buffer(&stream);
    QrBufferedIO& io = buffer;
    const std::function<void()> writes[] = {
        [&] { io.write("x", 1); },     [&] { io.write(nullptr, 0); },
        [&] { io.write('x'); },        [&] { io.writeEol(); },
        [&] { io.writeSpace(); },      [&] { io.writeChar(L"x", 1); },
        [&] { io.writeChar("x", 1); }, [&] { io.writeChar(L'x'); },
        [&] { io.writeChar('x'); },
    };
    for (const auto& write : writes)
        expectRefusal<QrStreamEx::ExWrite>("Write on input stream.", write);
    EXPECT_TRUE(stream.good());
    EXPECT_EQ(io.tell(), 0);
    EXPECT_EQ(io.read(), 'a');
}

TEST(OutBuffer, RefusesEveryReadAndTouchesNothing) {
    std::ostringstream stream;
    QrOutBuffer buffer(&stream);
    QrBufferedIO& io = buffer;
    char narrow = 'n';
    wchar_t wide = L'w';
    const std::function<void()> reads[] = {
        [&] { io.read(&narrow, 1); },
        [&] { io.read(nullptr, 0); },
        [&] { io.read(); },
        [&] { io.readChar(&wide, 1, 1); },
        [&] { io.readChar(&narrow, 1, 1); },
        [&] { io.readChar(&narrow, 0, 0); },
        [&] { io.readChar(wide); },
        [&] { io.readChar(narrow); },
        [&] { io.ungetc(L'x'); },
        [&] { io.ungetc('x'); },
        [&] { io.skipWhiteSpace(1); },
        [&] { io.skipWhiteSpace(0); },
    };
    for (const auto& read : reads)
        expectRefusal<QrStreamEx::ExRead>("Read on output stream.", read);
    EXPECT_TRUE(stream.good());
    EXPECT_EQ(stream.str(), "");
    EXPECT_EQ(narrow, 'n');
    EXPECT_EQ(wide, L'w');
}

TEST(BothBuffers, HandNoObjects) {
    std::istringstream input("abc");
    std::ostringstream output;
    QrInBuffer in(&input);
    QrOutBuffer out(&output);
    QrStream stream;
    for (QrBufferedIO* io : {static_cast<QrBufferedIO*>(&in), static_cast<QrBufferedIO*>(&out)}) {
        expectRefusal<QrStreamEx::ExWriteObjectImp>(
            "writeObject not implemented.", [&] { io->writeObject(&in, stream, L"a", L"b"); });
        expectRefusal<QrStreamEx::ExWriteObjectImp>("writeObject not implemented.", [&] {
            io->writeObject(nullptr, stream, nullptr, nullptr);
        });
        expectRefusal<QrStreamEx::ExReadObjectImp>("readObject not implemented.", [&] {
            io->readObject(stream, &QrBufferedIO::uid, L"a", L"b");
        });
        expectRefusal<QrStreamEx::ExReadObjectImp>("readObject not implemented.", [&] {
            io->readObject(stream, nullptr, nullptr, nullptr);
        });
    }
}

TEST(BothBuffers, AreUncountedAnswerTheirInterfaceAndAreNotIgnored) {
    std::istringstream input;
    std::ostringstream output;
    QrInBuffer in(&input);
    QrOutBuffer out(&output);
    for (QrBufferedIO* io : {static_cast<QrBufferedIO*>(&in), static_cast<QrBufferedIO*>(&out)}) {
        EXPECT_FALSE(io->isBufferIgnored());
        EXPECT_EQ(io->newReference(), 1);
        EXPECT_EQ(io->release(), 1);
        EXPECT_EQ(io->release(), 1);
        io->destroy();
        constexpr QrUid uid{0x81C8DF23, 0xA78111D1, 0x988A4445, 0x53540000};
        EXPECT_EQ(io->getInterface(uid), io);
        EXPECT_EQ(io->getInterface({0x81C8DF24, 0xA78111D1, 0x988A4445, 0x53540000}), nullptr);
        EXPECT_TRUE(io->hasInterface(uid));
        EXPECT_EQ(io->getCastable(), io);
        EXPECT_EQ(QrPtr<QrBufferedIO>::adopt(safeCast<QrBufferedIO>(io)).get(), io);
    }
}

TEST(BothBuffers, DoNotTouchTheStreamWhenTheyAreMadeOrDestroyed) {
    std::istringstream input("abc");
    input.setstate(std::ios::badbit);
    { const QrInBuffer in(&input); }
    EXPECT_EQ(input.rdstate(), std::ios::badbit);
    { const QrInBuffer nothing(nullptr); }
    { const QrOutBuffer nothing(nullptr); }
}

} // namespace
