// SPDX-License-Identifier: BSL-1.0
// Compares the buffers with a simple model in long random sequences of operations.
#include "components/componentManager/bufferio.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <random>
#include <sstream>
#include <string>

using namespace Mz;

namespace {

/// A model of QrInBuffer in the "C" locale. It follows the documentation, one byte at a time.
class Model {
  public:
    explicit Model(std::string text) : text(std::move(text)) {}

    int readByte() {
        if (failed || position == text.size()) {
            failed = false;
            return -1;
        }
        return static_cast<unsigned char>(text[position++]);
    }

    std::string readBlock(int size) {
        std::string block;
        if (size < 1 || failed)
            return block;
        for (; size > 0; --size) {
            if (position == text.size()) {
                failed = true;
                break;
            }
            block += text[position++];
        }
        return block;
    }

    std::string readNarrow(int size, int count) {
        std::string result;
        while (count != 0 && static_cast<int>(result.size()) < size &&
               static_cast<int>(result.size()) != count) {
            const int byte = readByte();
            if (byte == -1)
                break;
            if (byte == 0) {
                --position;
                break;
            }
            result += static_cast<char>(byte);
        }
        return result;
    }

    std::wstring readWide(int size, int count) {
        std::wstring result;
        while (static_cast<int>(result.size()) < std::min(size, count)) {
            const int byte = readByte();
            if (byte == -1)
                break;
            if (byte == 0)
                --position;
            result += static_cast<wchar_t>(byte);
        }
        return result;
    }

    void skip(int count) {
        for (; count > 0; --count) {
            const int byte = readByte();
            if (byte == -1)
                return;
            if (std::string(" \t\n\v\f\r").find(static_cast<char>(byte)) == std::string::npos) {
                --position;
                return;
            }
            if (byte == '\r') {
                const int next = readByte();
                if (next != -1 && next != '\n')
                    --position;
                if (next != '\n')
                    return;
            }
        }
    }

    void putBack(char byte) {
        if (!failed)
            text[--position] = byte;
    }

    int64 tell() const { return failed ? -1 : static_cast<int64>(position); }

    /// Returns false where QrInBuffer throws.
    bool seek(int64 offset, int origin) {
        if (offset == 0 && origin == 1)
            return true;
        const auto end = static_cast<int64>(text.size());
        const int64 target = offset + (origin == 0   ? 0
                                       : origin == 1 ? static_cast<int64>(position)
                                                     : end);
        failed = failed || target < 0 || target > end;
        if (!failed)
            position = static_cast<std::size_t>(target);
        return !failed;
    }

    bool canPutBack() const { return position > 0; }
    bool isFailed() const { return failed; }

  private:
    std::string text;
    std::size_t position = 0;
    bool failed = false;
};

class Comparison {
  public:
    Comparison(const std::string& text, std::mt19937& random, std::ios::iostate mask)
        : model(text), stream(text), io(&stream), random(random) {
        stream.exceptions(mask);
    }

    void step() {
        switch (below(9)) {
        case 0: return byte();
        case 1: return block();
        case 2: return narrow();
        case 3: return wide();
        case 4: return single();
        case 5: return skip();
        case 6: return putBack();
        case 7: return seek();
        default: return tell();
        }
    }

    void compareStates() {
        ASSERT_EQ(stream.fail(), model.isFailed());
        ASSERT_FALSE(stream.bad());
    }

  private:
    int below(int limit) {
        return static_cast<int>(random() % static_cast<std::mt19937::result_type>(limit));
    }

    void byte() { ASSERT_EQ(io.read(), model.readByte()); }
    void tell() {
        ASSERT_EQ(io.tell(), model.tell());
        ASSERT_EQ(io.canSeek(), model.tell() != -1);
    }
    void block() {
        char buffer[16];
        const int size = below(18) - 2;
        const std::string expected = model.readBlock(size);
        const int length = io.read(buffer, size);
        ASSERT_EQ(std::string(buffer, static_cast<std::size_t>(length)), expected);
    }
    void narrow() {
        char buffer[16];
        const int size = below(18) - 2;
        const int count = below(12) - 2;
        const std::string expected = model.readNarrow(size, count < 0 ? 1000 : count);
        const int length = io.readChar(buffer, size, count);
        ASSERT_EQ(std::string(buffer, static_cast<std::size_t>(length)), expected);
    }
    void wide() {
        wchar_t buffer[16];
        const int size = below(18) - 2;
        const int count = below(12) - 2;
        const std::wstring expected = model.readWide(size, count);
        const int length = io.readChar(buffer, size, count);
        ASSERT_EQ(std::wstring(buffer, static_cast<std::size_t>(length)), expected);
    }
    void single() {
        if (below(2)) {
            char c = '#';
            const int expected = model.readByte();
            ASSERT_EQ(io.readChar(c), expected == -1 ? 0 : 1);
            ASSERT_EQ(c, expected == -1 ? '#' : static_cast<char>(expected));
        } else {
            wchar_t c = L'#';
            const std::wstring expected = model.readWide(1, 1);
            ASSERT_EQ(io.readChar(c), static_cast<int>(expected.size()));
            ASSERT_EQ(c, expected.empty() ? L'#' : expected[0]);
        }
    }
    void skip() {
        const int count = below(8) - 1;
        model.skip(count);
        io.skipWhiteSpace(count);
    }
    void putBack() {
        if (!model.canPutBack())
            return;
        const auto byte = static_cast<char>(below(256));
        model.putBack(byte);
        if (below(2))
            io.ungetc(byte);
        else
            io.ungetc(static_cast<wchar_t>(static_cast<unsigned char>(byte)));
    }
    void seek() {
        const int origin = below(3);
        const int64 offset = below(60) - 30;
        const bool succeeds = model.seek(offset, origin);
        if (succeeds) {
            ASSERT_EQ(io.seek(offset, origin), model.tell());
        } else {
            ASSERT_THROW(io.seek(offset, origin), QrStreamEx::ExReadError);
        }
    }

    Model model;
    std::stringstream stream;
    QrInBuffer io;
    std::mt19937& random;
};

std::string randomText(std::mt19937& random) {
    static constexpr char common[] = {' ', '\t', '\r', '\n', '\0', 'a', 'b', '\xFF', '\x85'};
    std::string text;
    for (auto length = 1 + random() % 40; length > 0; --length)
        text += random() % 4 ? common[random() % sizeof common] : static_cast<char>(random() % 256);
    return text;
}

TEST(RandomInput, IsReadAsTheModelReadsIt) {
    std::mt19937 random(20240917);
    for (int round = 0; round < 4000; ++round) {
        const std::string text = randomText(random);
        const auto mask = static_cast<std::ios::iostate>(
            round % 2 ? std::ios::goodbit
                      : std::ios::badbit | std::ios::eofbit | std::ios::failbit);
        Comparison comparison(text, random, mask);
        for (int step = 0; step < 40; ++step) {
            SCOPED_TRACE("round " + std::to_string(round) + ", step " + std::to_string(step));
            comparison.step();
            comparison.compareStates();
            if (testing::Test::HasFatalFailure())
                return;
        }
    }
}

TEST(RandomOutput, IsWrittenAsTheModelWritesIt) {
    std::mt19937 random(20240918);
    for (int round = 0; round < 500; ++round) {
        std::string expected;
        std::ostringstream stream;
        QrOutBuffer io(&stream);
        for (int step = 0; step < 40; ++step) {
            const std::string text = randomText(random);
            const std::wstring wide = [&] {
                std::wstring result;
                for (const char c : text)
                    result += static_cast<wchar_t>(static_cast<unsigned char>(c));
                return result;
            }();
            const int size = static_cast<int>(text.size());
            switch (random() % 7) {
            case 0:
                io.write(text.data(), size);
                expected += text;
                break;
            case 1:
                EXPECT_EQ(io.writeChar(text.data(), size), size);
                expected += text;
                break;
            case 2:
                EXPECT_EQ(io.writeChar(wide.data(), size), size);
                expected += text;
                break;
            case 3:
                io.writeChar(wide[0]);
                expected += text[0];
                break;
            case 4:
                io.writeChar(text[0]);
                expected += text[0];
                break;
            case 5:
                io.writeEol();
                expected += '\n';
                break;
            default: io.writeSpace(); expected += ' ';
            }
            ASSERT_EQ(io.tell(), static_cast<int64>(expected.size()));
        }
        ASSERT_EQ(stream.str(), expected);
    }
}

} // namespace
