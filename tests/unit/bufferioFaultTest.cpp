// SPDX-License-Identifier: BSL-1.0
// Tests the buffers on a medium that fails or throws. Every operation runs with every exception
// mask and with the fault beginning at each of the first calls; it must throw the documented
// exception or none.
#include "components/componentManager/bufferio.h"
#include "tests/unit/faultyBuffer.h"

#include <gtest/gtest.h>

#include <functional>
#include <istream>
#include <ostream>
#include <string>
#include <vector>

using namespace Mz;
using namespace Mz::Test;

namespace {

/// When an operation throws because of a broken medium: if the badbit is set (for `BadbitOfReads`
/// except after a failed put-back), never, or if the position is lost.
enum class Notices { Badbit, BadbitOfReads, Nothing, LostPosition };

struct Operation {
    const char* name;
    Notices notices;
    std::function<void(QrBufferedIO&)> run;
};

const std::vector<Operation>& inputOperations() {
    static char narrow[8];
    static wchar_t wide[8];
    static const std::vector<Operation> operations = {
        {"read()", Notices::Badbit, [](QrBufferedIO& io) { io.read(); }},
        {"read(block)", Notices::Badbit, [](QrBufferedIO& io) { io.read(narrow, 5); }},
        {"readChar(char)", Notices::Badbit, [](QrBufferedIO& io) { io.readChar(narrow[0]); }},
        {"readChar(wchar_t)", Notices::Badbit, [](QrBufferedIO& io) { io.readChar(wide[0]); }},
        {"readChar(chars)", Notices::Badbit, [](QrBufferedIO& io) { io.readChar(narrow, 5, 5); }},
        {"readChar(chars) to a NUL", Notices::Badbit,
         [](QrBufferedIO& io) { io.readChar(narrow, 8, 8); }},
        {"readChar(wchar_ts)", Notices::Badbit, [](QrBufferedIO& io) { io.readChar(wide, 8, 8); }},
        {"skipWhiteSpace", Notices::BadbitOfReads, [](QrBufferedIO& io) { io.skipWhiteSpace(9); }},
        {"ungetc(wchar_t)", Notices::Badbit, [](QrBufferedIO& io) { io.ungetc(L'x'); }},
        {"ungetc(char)", Notices::Nothing, [](QrBufferedIO& io) { io.ungetc('x'); }},
        {"tell", Notices::Nothing, [](QrBufferedIO& io) { io.tell(); }},
        {"canSeek", Notices::Nothing, [](QrBufferedIO& io) { io.canSeek(); }},
        {"seek(0, 1)", Notices::Nothing, [](QrBufferedIO& io) { io.seek(0, 1); }},
        {"seek", Notices::LostPosition, [](QrBufferedIO& io) { io.seek(2, 0); }},
        {"seek to the end", Notices::LostPosition, [](QrBufferedIO& io) { io.seek(0, 2); }},
    };
    return operations;
}

const std::vector<Operation>& outputOperations() {
    static const std::vector<Operation> operations = {
        {"write(char)", Notices::Badbit, [](QrBufferedIO& io) { io.write('x'); }},
        {"write(block)", Notices::Badbit, [](QrBufferedIO& io) { io.write("abc", 3); }},
        {"writeChar(chars)", Notices::Badbit, [](QrBufferedIO& io) { io.writeChar("abc", 3); }},
        {"writeChar(wchar_ts)", Notices::Badbit, [](QrBufferedIO& io) { io.writeChar(L"abc", 3); }},
        {"writeChar(char)", Notices::Badbit, [](QrBufferedIO& io) { io.writeChar('x'); }},
        {"writeChar(wchar_t)", Notices::Badbit, [](QrBufferedIO& io) { io.writeChar(L'x'); }},
        {"writeEol", Notices::Nothing, [](QrBufferedIO& io) { io.writeEol(); }},
        {"writeSpace", Notices::Nothing, [](QrBufferedIO& io) { io.writeSpace(); }},
        {"tell", Notices::Nothing, [](QrBufferedIO& io) { io.tell(); }},
        {"canSeek", Notices::Nothing, [](QrBufferedIO& io) { io.canSeek(); }},
        {"seek(0, 1)", Notices::Nothing, [](QrBufferedIO& io) { io.seek(0, 1); }},
        {"seek", Notices::LostPosition, [](QrBufferedIO& io) { io.seek(2, 0); }},
    };
    return operations;
}

/// A combination of exception mask, kind of fault and the call at which it begins.
struct Circumstances {
    std::ios::iostate mask;
    Fault fault;
    int at;
};

template <class Check>
void underEveryCircumstance(Check&& check) {
    constexpr std::ios::iostate bits[] = {std::ios::badbit, std::ios::eofbit, std::ios::failbit};
    for (unsigned int which = 0; which < 8; ++which) {
        std::ios::iostate mask = std::ios::goodbit;
        for (unsigned int bit = 0; bit < 3; ++bit)
            if (which >> bit & 1)
                mask |= bits[bit];
        check(Circumstances{mask, Fault::None, 0});
        for (const Fault fault : {Fault::Fails, Fault::Throws})
            for (int at = 1; at <= 12; ++at)
                check(Circumstances{mask, fault, at});
    }
}

/// Runs the operation and expects exactly the exception that its `notices` states.
template <class Ex>
void runUnder(const Circumstances& circumstances, const Operation& operation, QrBufferedIO& io,
              const FaultyBuffer& medium, std::ios& stream) {
    SCOPED_TRACE(std::string(operation.name) + ", mask " + std::to_string(circumstances.mask) +
                 ", fault " + std::to_string(static_cast<int>(circumstances.fault)) + " at " +
                 std::to_string(circumstances.at));
    bool raised = false;
    try {
        operation.run(io);
    } catch (const Ex&) {
        raised = true;
    } catch (...) {
        FAIL() << "another exception than the expected one";
    }
    switch (operation.notices) {
    case Notices::Badbit: EXPECT_EQ(raised, stream.bad()); break;
    case Notices::BadbitOfReads:
        // A failed put-back is reported only by the next read.
        if (!raised && stream.bad()) {
            EXPECT_THROW(io.read(), Ex);
        } else {
            EXPECT_EQ(raised, stream.bad());
        }
        break;
    case Notices::Nothing: EXPECT_FALSE(raised); break;
    case Notices::LostPosition: EXPECT_EQ(raised, medium.wentWrong() || stream.fail()); break;
    }
    EXPECT_EQ(stream.exceptions(), circumstances.mask) << "the operation must restore the mask";
}

TEST(FaultyInput, RaisesTheStatedExceptionAndNothingElse) {
    underEveryCircumstance([](const Circumstances& circumstances) {
        for (const Operation& operation : inputOperations())
            for (const char* text : {"ab\0cdefgh", " \r\n \rabcdef", "a", ""}) {
                const std::string content =
                    *text == 'a' && text[1] ? std::string(text, 9) : std::string(text);
                FaultyBuffer medium(content, circumstances.fault, circumstances.at);
                std::istream stream(&medium);
                stream.exceptions(circumstances.mask);
                QrInBuffer in(&stream);
                runUnder<QrStreamEx::ExReadError>(circumstances, operation, in, medium, stream);
            }
    });
}

TEST(FaultyInput, IsNoticedByAReadOfNothing) {
    for (const int size : {0, -1}) {
        std::istringstream stream("abc");
        QrInBuffer in(&stream);
        char byte = 'x';
        EXPECT_EQ(in.read(&byte, size), 0);
        stream.setstate(std::ios::badbit);
        EXPECT_THROW(in.read(&byte, size), QrStreamEx::ExReadError);
        EXPECT_EQ(byte, 'x');
        EXPECT_EQ(stream.rdstate(), std::ios::badbit);
    }
}

TEST(FaultyInput, RaisesTheStatedExceptionAlsoFromTheMiddle) {
    underEveryCircumstance([](const Circumstances& circumstances) {
        for (const Operation& operation : inputOperations()) {
            FaultyBuffer medium("  \r\nabc", circumstances.fault, circumstances.at + 3);
            std::istream stream(&medium);
            QrInBuffer in(&stream);
            char block[3];
            try {
                in.read(block, 3);
                in.read();
            } catch (const QrStreamEx::ExReadError&) {
                continue;
            }
            if (stream.bad())
                continue;
            stream.exceptions(circumstances.mask);
            runUnder<QrStreamEx::ExReadError>(circumstances, operation, in, medium, stream);
        }
    });
}

TEST(FaultyOutput, RaisesTheStatedExceptionAndNothingElse) {
    underEveryCircumstance([](const Circumstances& circumstances) {
        for (const Operation& operation : outputOperations()) {
            FaultyBuffer medium("abcdef", circumstances.fault, circumstances.at);
            std::ostream stream(&medium);
            stream.exceptions(circumstances.mask);
            QrOutBuffer out(&stream);
            runUnder<QrStreamEx::ExWriteError>(circumstances, operation, out, medium, stream);
        }
    });
}

TEST(FaultyInput, ThatOnlyEndsIsTheEndOfInput) {
    for (const std::ios::iostate mask :
         {std::ios::goodbit, std::ios::eofbit | std::ios::failbit | std::ios::badbit}) {
        FaultyBuffer medium("abcdef", Fault::Fails, 3);
        std::istream stream(&medium);
        stream.exceptions(mask);
        QrInBuffer in(&stream);
        EXPECT_EQ(in.read(), 'a');
        EXPECT_EQ(in.read(), 'b');
        EXPECT_EQ(in.read(), -1);
        EXPECT_TRUE(stream.good());
        EXPECT_EQ(in.read(), -1);
        char block[2];
        EXPECT_EQ(in.read(block, 2), 0);
        EXPECT_TRUE(stream.fail());
    }
}

TEST(MaskedInput, AtItsEndGivesResultsAndNoExceptions) {
    for (const std::ios::iostate bit : {std::ios::badbit, std::ios::eofbit, std::ios::failbit}) {
        FaultyBuffer medium("abcd", Fault::None, 0);
        std::istream stream(&medium);
        stream.exceptions(bit);
        QrInBuffer in(&stream);
        char block[10];
        EXPECT_EQ(in.read(block, 10), 4);
        EXPECT_TRUE(stream.eof());
        EXPECT_TRUE(stream.fail());
        EXPECT_EQ(in.tell(), -1);
        EXPECT_EQ(in.read(), -1);
        EXPECT_TRUE(stream.good());
        EXPECT_EQ(in.tell(), 4);
        EXPECT_EQ(in.read(), -1);
        EXPECT_THROW(in.seek(99, 0), QrStreamEx::ExReadError);
        EXPECT_EQ(stream.rdstate(), std::ios::failbit);
        EXPECT_EQ(in.read(), -1);
        EXPECT_EQ(in.seek(1, 0), 1);
        EXPECT_EQ(in.read(), 'b');
    }
}

TEST(ThrowingInput, IsAReadErrorAndLeavesTheBadbit) {
    FaultyBuffer medium("abcdef", Fault::Throws, 3);
    std::istream stream(&medium);
    QrInBuffer in(&stream);
    EXPECT_EQ(in.read(), 'a');
    EXPECT_EQ(in.read(), 'b');
    EXPECT_THROW(in.read(), QrStreamEx::ExReadError);
    EXPECT_TRUE(stream.bad());
    EXPECT_THROW(in.read(), QrStreamEx::ExReadError);
}

TEST(ThrowingInput, WhilePuttingBackIsAReadError) {
    // The first three calls read up to the NUL. The fourth call puts it back.
    for (const Fault fault : {Fault::Fails, Fault::Throws}) {
        FaultyBuffer medium(std::string("ab\0c", 4), fault, 4);
        std::istream stream(&medium);
        QrInBuffer in(&stream);
        char narrow[8];
        EXPECT_THROW(in.readChar(narrow, 8, 8), QrStreamEx::ExReadError);
        EXPECT_TRUE(stream.bad());
    }
}

TEST(FaultyOutput, KeepsWhatWasWrittenBeforeIt) {
    FaultyBuffer medium("", Fault::Fails, 3);
    std::ostream stream(&medium);
    QrOutBuffer out(&stream);
    EXPECT_THROW(out.writeChar(L"abcd", 4), QrStreamEx::ExWriteError);
    EXPECT_EQ(medium.content(), "ab");
}

TEST(FaultyOutput, IsNoticedByTheNextWriteAfterALineEnd) {
    FaultyBuffer medium("", Fault::Throws, 1);
    std::ostream stream(&medium);
    QrOutBuffer out(&stream);
    EXPECT_NO_THROW(out.writeEol());
    EXPECT_NO_THROW(out.writeSpace());
    EXPECT_TRUE(stream.bad());
    EXPECT_THROW(out.write('x'), QrStreamEx::ExWriteError);
    EXPECT_EQ(medium.content(), "");
}

} // namespace
