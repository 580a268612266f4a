// SPDX-License-Identifier: BSL-1.0
// Tests streams on media that fail at the n-th call, for every n.
#include "tests/support/failingMedium.h"
#include "tests/streams/support.h"

#include "components/componentManager/manager/componentImpPrivate.h"

#include <gtest/gtest.h>

#include <functional>

namespace {

using namespace Mz::Test;
using Mz::ComponentManager;
using Mz::QrBinaryStream;
using Mz::QrPersistant;
using Mz::QrPtr;
using Mz::QrStream;
using Mz::QrStreamEx;
using Mz::QrTextStream;

void fillManager(ComponentManager& manager) {
    Mz::ComponentLibrary& library = manager.libraries.emplace_back(manager);
    library.directory = L"c:\\x";
    library.fileName = L"y";
    ComponentManager::Builder& builder = library.builders.emplace_back();
    builder.library = &library;
    builder.name = L"n";
    manager.initialised = true;
}

QrPtr<QrPersistant> companionOf(ComponentManager& manager) {
    return QrPtr<QrPersistant>::adopt(
        Mz::safeCast<QrPersistant>(static_cast<Mz::QrComponentManager*>(&manager)));
}

void writeEverything(QrStream& stream) {
    const int ints[300] = {1, 2, 3};
    const std::wstring strings[2] = {L"ab", L"c"};
    const bool flags[2] = {true, false};
    stream << 'c' << static_cast<unsigned char>(2) << static_cast<short>(3)
           << static_cast<unsigned short>(4) << 5 << 6U << 7L << 8UL << 9LL << 10ULL << 1.5F << 2.5
           << true << wchar_t(65) << std::wstring(L"xyz") << Mz::QrUid{1, 2, 3, 4};
    stream.write(ints[0], 300);
    stream.write(strings[0], 2);
    stream.write(flags[0], 2);
    stream.formattedWrite(L"%d %s", 5, L"text");
    ComponentManager manager;
    fillManager(manager);
    companionOf(manager)->write(stream);
}

template <class Stream>
void failWriting(bool throwing, bool masked) {
    const std::string whole = written<Stream>(writeEverything);
    int calls = 0;
    for (bool failed = true; failed; ++calls) {
        SCOPED_TRACE(calls);
        FailingMedium medium({}, calls, throwing);
        std::ostream sink(&medium);
        if (masked)
            sink.exceptions(std::ios::badbit | std::ios::failbit | std::ios::eofbit);
        Mz::QrOutBuffer buffer(&sink);
        Stream stream(&buffer);
        bool thrown = false;
        try {
            writeEverything(stream);
        } catch (const QrStreamEx::ExWriteError& error) {
            EXPECT_STREQ(error.getReason(), "Error writing stream.");
            thrown = true;
        }
        failed = medium.failed();
        EXPECT_EQ(thrown, failed);
        EXPECT_TRUE(whole.starts_with(medium.accepted)) << medium.accepted.size();
        if (!failed) {
            EXPECT_EQ(medium.accepted, whole);
        }
    }
    EXPECT_GT(calls, 50);
}

TEST(FailingMedium, EveryWriterRaisesWriteErrorAndKeepsWhatWasAccepted) {
    for (const bool throwing : {false, true})
        for (const bool masked : {false, true}) {
            failWriting<QrTextStream>(throwing, masked);
            failWriting<QrBinaryStream>(throwing, masked);
            failWriting<BaseStream>(throwing, masked);
        }
}

TEST(FailingMedium, ASeparatorThatFailsIsNoticedByTheValueBehindIt) {
    FailingMedium medium({}, 1, false);
    std::ostream sink(&medium);
    Mz::QrOutBuffer buffer(&sink);
    QrTextStream stream(&buffer);
    stream << 1;
    EXPECT_THROW(stream << 2, QrStreamEx::ExWriteError);
    EXPECT_EQ(medium.accepted, "1");
}

using Reader = std::function<void(QrStream&)>;

template <class T>
void single(QrStream& stream) {
    T value{};
    stream >> value;
}
template <class T>
void counted(QrStream& stream) {
    T values[2]{};
    EXPECT_EQ(stream.read(values[0], 2), 2);
}

/// Expects that every reader throws `ExReadError` where the medium throws, and throws nothing else
/// where the medium ends.
void failReading(const std::string& input, bool binary, const Reader& read) {
    for (const bool throwing : {true, false}) {
        bool failed = true;
        for (int calls = 0; failed && calls < 5000; ++calls) {
            SCOPED_TRACE(testing::Message() << input << " after " << calls);
            FailingMedium medium(input, calls, throwing);
            std::istream source(&medium);
            Mz::QrInBuffer buffer(&source);
            bool thrown = false;
            const auto run = [&](QrStream& stream) {
                try {
                    read(stream);
                } catch (const QrStreamEx::ExReadError&) {
                    thrown = true;
                }
            };
            if (binary) {
                QrBinaryStream stream(&buffer);
                run(stream);
            } else {
                QrTextStream stream(&buffer);
                run(stream);
            }
            failed = medium.failed();
            if (throwing || !failed) {
                EXPECT_EQ(thrown, failed);
            }
        }
        EXPECT_FALSE(failed);
    }
}

template <class T>
void failReadingText(const std::string& input) {
    failReading(input, false, single<T>);
}

TEST(FailingMedium, EveryTextReaderRaisesReadError) {
    failReadingText<char>(" -12 ");
    failReadingText<unsigned char>("12 ");
    failReadingText<short>("-12x");
    failReadingText<unsigned short>("12 ");
    failReadingText<int>("\n 12 ");
    failReadingText<unsigned int>("12 ");
    failReadingText<long>("12 ");
    failReadingText<unsigned long>("12 ");
    failReadingText<Mz::int64>("12 ");
    failReadingText<unsigned long long>("12 ");
    failReadingText<float>("-1.5e+3 ");
    failReadingText<double>("1.5 ");
    failReadingText<bool>("1");
    failReadingText<std::wstring>("3 abcd");
    failReadingText<Mz::QrUid>("1 2 3 4 ");
    failReading("a b", false, [](QrStream& stream) {
        wchar_t text[8];
        EXPECT_NO_THROW(stream.formattedRead(L""));
        if (stream.formattedRead(L"%s %[b]", text, text + 4) != 2)
            throw QrStreamEx::ExReadError("test", 1);
    });
}

TEST(FailingMedium, EveryBinaryReaderRaisesReadError) {
    const std::string bytes = std::string(7, '\0') + "\1xyzabcdefg";
    failReading(bytes, true, single<char>);
    failReading(bytes, true, single<short>);
    failReading(bytes, true, single<int>);
    failReading(bytes, true, single<long>);
    failReading(bytes, true, single<Mz::int64>);
    failReading(bytes, true, single<float>);
    failReading(bytes, true, single<double>);
    failReading(bytes, true, single<bool>);
    failReading(bytes, true, single<Mz::QrUid>);
    failReading(fromHex("00 00 00 02 61 62"), true, single<std::wstring>);
}

TEST(FailingMedium, EveryCountedReaderRaisesReadErrorWhereTheMediumThrows) {
    const auto throwsEverywhere = [](const std::string& input, const Reader& read) {
        bool failed = true;
        for (int calls = 0; failed && calls < 5000; ++calls) {
            FailingMedium medium(input, calls, true);
            std::istream source(&medium);
            Mz::QrInBuffer buffer(&source);
            QrBinaryStream stream(&buffer);
            bool thrown = false;
            try {
                read(stream);
            } catch (const QrStreamEx::ExReadError&) {
                thrown = true;
            }
            failed = medium.failed();
            EXPECT_EQ(thrown, failed) << calls;
        }
        EXPECT_FALSE(failed);
    };
    const std::string bytes(16, '\1');
    throwsEverywhere(bytes, counted<char>);
    throwsEverywhere(bytes, counted<int>);
    throwsEverywhere(bytes, counted<long>);
    throwsEverywhere(bytes, counted<wchar_t>);
    throwsEverywhere(bytes, counted<bool>);
    throwsEverywhere(bytes, counted<double>);
    throwsEverywhere(fromHex("00 00 00 01 61 00 00 00 02 62 63"), counted<std::wstring>);
}

TEST(FailingMedium, ARecordedListRaisesReadErrorAndKeepsNothingHalfRead) {
    const std::string list = written<QrBinaryStream>([](QrStream& stream) {
        ComponentManager manager;
        fillManager(manager);
        companionOf(manager)->write(stream);
    });
    bool failed = true;
    for (int calls = 0; failed; ++calls) {
        SCOPED_TRACE(calls);
        FailingMedium medium(list, calls, true);
        std::istream source(&medium);
        Mz::QrInBuffer buffer(&source);
        QrBinaryStream stream(&buffer);
        ComponentManager manager;
        bool thrown = false;
        try {
            companionOf(manager)->read(stream);
        } catch (const QrStreamEx::ExReadError&) {
            thrown = true;
        }
        failed = medium.failed();
        EXPECT_EQ(thrown, failed);
        for (const Mz::ComponentLibrary& library : manager.libraries)
            EXPECT_EQ(library.builders.size(), failed ? 0U : 1U);
    }
}

TEST(FailingMedium, TheNumberIsStoredEvenIfTheLookAheadCannotBePutBack) {
    // Two calls return "4" and "x". The third call, which puts the "x" back, fails.
    FailingMedium medium("4x", 2, false);
    std::istream source(&medium);
    Mz::QrInBuffer buffer(&source);
    QrTextStream stream(&buffer);
    int value = 0;
    EXPECT_THROW(stream >> value, QrStreamEx::ExReadError);
    EXPECT_EQ(value, 4);
}

} // namespace
